package com.pelorin.photos.quenby.autoenhance;

import android.graphics.Bitmap;

/** Tells near-duplicates, two shots of one scene a moment apart. Stateless; any thread may call. */
public final class Duplicates {
    private Duplicates() {}

    /** A photo with what is known of its taking. */
    public static final class Photo {
        private final Bitmap bitmap;
        private final double seconds;
        private final int orientation;

        /**
         * Describes a photo; its pixels are not copied.
         *
         * @param bitmap      of ARGB_8888; a small version will do
         * @param seconds     its capture time; only differences count
         * @param orientation its orientation code; only equality counts
         * @throws IllegalArgumentException when the time is not finite
         */
        public Photo(Bitmap bitmap, double seconds, int orientation) {
            if (!Double.isFinite(seconds)) {
                throw new IllegalArgumentException("the capture time is " + seconds);
            }
            this.bitmap = bitmap;
            this.seconds = seconds;
            this.orientation = orientation;
        }
    }

    /**
     * Scores how likely two photos are near-duplicates, in the manner of log odds: 0 is the even
     * chance, the same photo twice scores about 3.65, unrelated ones a day apart about -7.
     *
     * @param a one photo
     * @param b the other
     * @return the score
     * @throws UnsuitableBitmapException when a bitmap cannot be read
     * @throws OutOfMemoryError          when memory does not suffice
     */
    public static float score(Photo a, Photo b) {
        Bitmaps.requireReadable(a.bitmap, "the first photo");
        Bitmaps.requireReadable(b.bitmap, "the second photo");
        NativeLibrary.load();
        float score = ImageDupeDetector.similarityScore(
                a.bitmap, a.seconds, a.orientation, b.bitmap, b.seconds, b.orientation);
        if (score == ImageDupeDetector.SIMILARITY_ERROR) { // recycled meanwhile
            throw new UnsuitableBitmapException("a photo's pixels cannot be read");
        }
        return score;
    }

    /**
     * Scores two photos by what was kept of them, in the same manner.
     *
     * @param a               one photo's distribution
     * @param b               the other's
     * @param secondsApart    between their captures, whichever came first
     * @param sameOrientation whether their orientations are equal
     * @return the score
     * @throws IllegalArgumentException when the time is not finite
     */
    public static float score(
            GreenCdf a, GreenCdf b, double secondsApart, boolean sameOrientation) {
        return score(a.distanceTo(b), secondsApart, sameOrientation);
    }

    /**
     * Scores two photos whose distance is known, in the same manner.
     *
     * @param distance        what {@link GreenCdf#distanceTo} gave
     * @param secondsApart    between their captures, whichever came first
     * @param sameOrientation whether their orientations are equal
     * @return the score
     * @throws IllegalArgumentException when the time is not finite
     */
    public static float score(float distance, double secondsApart, boolean sameOrientation) {
        if (!Double.isFinite(secondsApart)) {
            throw new IllegalArgumentException("the time between is " + secondsApart);
        }
        NativeLibrary.loadPhoto();
        return PhotoBytes.score(distance, secondsApart, sameOrientation);
    }

    /**
     * Tells how far apart two photos may be taken and still score above a threshold.
     *
     * @param threshold       of the score
     * @param sameOrientation whether their orientations are equal
     * @return seconds; negative when no photos score that much
     */
    public static double window(float threshold, boolean sameOrientation) {
        NativeLibrary.loadPhoto();
        return PhotoBytes.window(threshold, sameOrientation);
    }

    /**
     * Tells whether two photos are more likely near-duplicates than not.
     *
     * @param a one photo
     * @param b the other
     * @return whether their score is above 0
     * @throws UnsuitableBitmapException when a bitmap cannot be read
     */
    public static boolean likely(Photo a, Photo b) {
        return score(a, b) > 0;
    }
}
