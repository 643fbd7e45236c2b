package com.pelorin.photos.quenby.autoenhance;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.io.IOException;

/**
 * The natives of the enhancement engine, as they are. {@link EnhanceSession} and {@link JpegJob}
 * are the comfortable way to them: they check what these take on trust, report what these log.
 * Any thread may call, several at once on one session too.
 *
 * <p>{@link NativeLibrary#load} comes first: this class does not load the library, since loading
 * initialises it, and a second thread that did both in another order would wait for ever. Until
 * then every method throws {@link UnsatisfiedLinkError}.
 */
public class QuenbyEngine {
    /** Makes a caller of the natives; it has no state. */
    public QuenbyEngine() {}

    /**
     * Opens a session on a copy of a photo.
     *
     * @param bitmap the photo, of {@code ARGB_8888}
     * @return the session's handle, to be released, or 0 when the bitmap cannot be read
     * @throws OutOfMemoryError when the copy does not fit into memory
     */
    public native long init(Bitmap bitmap);

    /**
     * Tells a session the faces of its photo, which is needed once before filters are applied.
     * Filters prepared before are forgotten.
     *
     * @param faces  in fractions of the photo's width and height; null elements are skipped,
     *               null is none
     * @param handle from {@link #init}; nothing happens for a handle that is no session
     * @throws OutOfMemoryError when memory does not suffice; the session is then as before
     */
    public native void preprocess(RectF[] faces, long handle);

    /**
     * Ends a session. Calls at work on it finish first.
     *
     * @param handle from {@link #init}; nothing happens for 0 or a handle that is no session
     */
    public native void releaseSession(long handle);

    /**
     * Writes the filtered photo into a bitmap. Nothing is written for a handle that is no session,
     * before {@link #preprocess}, or into a bitmap that is smaller than the photo or not of
     * {@code ARGB_8888}. The session keeps one picture of the photo's size that a call filtered
     * into for the next call, until it is released; calls at once have one each meanwhile.
     *
     * @param handle     from {@link #init}
     * @param outBitmap  receives the photo in its upper left corner
     * @param filterName a name such as "AE0", see {@link Filter}; unknown ones give the photo
     * @param params     the filter's parameters, such as "slider=0.4;"; null is none
     * @throws IllegalArgumentException when a required parameter is missing or unreadable
     * @throws OutOfMemoryError         when memory does not suffice
     */
    public native void applyAutoEnhanceFilter(
            long handle, Bitmap outBitmap, String filterName, String params);

    /**
     * Filters a JPEG file into another, which may be the same. A rotation leaves the rotated copy
     * at {@code outputPath} when something fails after it. The output has no metadata: the EXIF
     * orientation, by which the picture is not turned, times, colour profile and all else are
     * dropped. {@link JpegJob} and {@link PhotoBytes} turn the picture and keep them.
     *
     * @param inputPath   the file to read
     * @param outputPath  the file to write, in one step
     * @param rotation    degrees clockwise, a multiple of 90
     * @param faces       in fractions of the rotated photo; null is none
     * @param decodeScale 1, 2, 4 or 8: what the size is divided by
     * @param filterName  as for {@link #applyAutoEnhanceFilter}
     * @param params      as for {@link #applyAutoEnhanceFilter}
     * @return true when the file was written, false when the input cannot be read
     * @throws IOException              when a file cannot be written, or the input of a rotation
     *                                  cannot be read
     * @throws IllegalArgumentException for a null path and for parameters as above
     * @throws RuntimeException         when the input of a rotation is damaged, or the rotation is
     *                                  no multiple of 90 degrees
     * @throws OutOfMemoryError         when memory does not suffice
     */
    public native boolean applyAutoEnhanceFilterToJpegFile(String inputPath, String outputPath,
            int rotation, RectF[] faces, int decodeScale, String filterName, String params)
            throws IOException;
}
