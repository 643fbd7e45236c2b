package com.pelorin.photos.quenby.autoenhance;

import android.graphics.Bitmap;

/**
 * The native of the duplicate detector, as it is. {@link Duplicates} is the comfortable way to it.
 * Any thread may call.
 *
 * <p>{@link NativeLibrary#load} comes first: this class does not load the library, since loading
 * initialises it. Until then the method throws {@link UnsatisfiedLinkError}.
 */
public class ImageDupeDetector {
    /** What {@link #similarityScore} answers when a bitmap cannot be read; no photos score that. */
    public static final float SIMILARITY_ERROR = -2222.0f;

    /** Makes nothing of use: the only method is static. */
    public ImageDupeDetector() {}

    /**
     * Scores how likely two photos are near-duplicates, in the manner of log odds: 0 is the even
     * chance, the same photo twice scores about 3.65.
     *
     * @param bitmap1      the first photo, of {@code ARGB_8888}
     * @param time1        its capture time in seconds; only the difference counts
     * @param orientation1 its orientation; only equality counts
     * @param bitmap2      the second photo
     * @param time2        its capture time
     * @param orientation2 its orientation
     * @return the score, or {@link #SIMILARITY_ERROR}
     */
    public static native float similarityScore(Bitmap bitmap1, double time1, int orientation1,
            Bitmap bitmap2, double time2, int orientation2);
}
