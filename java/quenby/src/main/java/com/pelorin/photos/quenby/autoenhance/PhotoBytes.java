package com.pelorin.photos.quenby.autoenhance;

import android.graphics.RectF;
import java.nio.ByteBuffer;
import java.util.List;
import java.util.concurrent.CancellationException;
import java.util.function.Consumer;

/**
 * A photo's file in memory, of any format that the {@code quenby} command reads, and what can be
 * made of it: the enhanced file with its metadata, its facts, its quality, its green distribution.
 * Pictures are upright before anything is made of them. Immutable: each setting gives a new one,
 * and any thread may ask it for anything, several at once too.
 *
 * <pre>{@code
 * byte[] enhanced = PhotoBytes.of(file).quality(85).enhance(0.4f);
 * }</pre>
 *
 * <p>The bytes are not copied before work begins, those of a direct buffer not at all: they must
 * not change meanwhile. Every method that reads the picture throws {@link CancellationException}
 * when it is given up, and gives all or nothing.
 */
public final class PhotoBytes {
    private final byte[] array;
    private final ByteBuffer buffer;
    private final int offset;
    private final int length;
    private final Settings settings;

    private static final class Settings implements Cloneable {
        int quality = 90;
        int subsampling;
        int rotation;
        int scale = 1;
        float[] faces;
        boolean png;
        boolean mark = true;
        Consumer<? super Loss> losses;
        Cancellation cancellation;
        long maxBytes;
        long maxPixels;
        int maxScans;
        int maxSegments;

        Settings copy() {
            try {
                return (Settings) clone();
            } catch (CloneNotSupportedException error) {
                throw new IllegalStateException(error);
            }
        }
    }

    private PhotoBytes(byte[] array, ByteBuffer buffer, int offset, int length, Settings settings) {
        this.array = array;
        this.buffer = buffer;
        this.offset = offset;
        this.length = length;
        this.settings = settings;
    }

    private PhotoBytes with(Settings changed) {
        return new PhotoBytes(array, buffer, offset, length, changed);
    }

    /**
     * Takes a file's bytes: JPEG of quality 90, upright, full size, and the faces that the file knows of.
     *
     * @param file all of them
     * @return the photo
     */
    public static PhotoBytes of(byte[] file) {
        return of(file, 0, file.length);
    }

    /**
     * Takes a file's bytes out of an array.
     *
     * @param array  holds them
     * @param offset where they begin
     * @param length how many there are
     * @return the photo
     * @throws IndexOutOfBoundsException when they are not inside
     */
    public static PhotoBytes of(byte[] array, int offset, int length) {
        if (offset < 0 || length < 0 || length > array.length - offset) {
            throw new IndexOutOfBoundsException(
                    length + " bytes at " + offset + " of " + array.length);
        }
        return new PhotoBytes(array, null, offset, length, new Settings());
    }

    /**
     * Takes a file's bytes out of a buffer, from its position to its limit, neither of which moves.
     *
     * @param file direct, or with an array behind it
     * @return the photo
     * @throws IllegalArgumentException for a buffer that is read-only and not direct
     */
    public static PhotoBytes of(ByteBuffer file) {
        if (file.isDirect()) {
            return new PhotoBytes(null, file.duplicate(), file.position(), file.remaining(),
                    new Settings());
        }
        if (!file.hasArray()) {
            throw new IllegalArgumentException("a buffer that is neither direct nor an array's");
        }
        return of(file.array(), file.arrayOffset() + file.position(), file.remaining());
    }

    /**
     * Chooses the quality of JPEG files that are made.
     *
     * @param quality 1 to 100
     * @return a photo that does
     * @throws IllegalArgumentException for another quality
     */
    public PhotoBytes quality(int quality) {
        if (quality < 1 || quality > 100) {
            throw new IllegalArgumentException("quality: is not from 1 to 100: " + quality);
        }
        Settings changed = settings.copy();
        changed.quality = quality;
        return with(changed);
    }

    /**
     * Makes JPEG files of the quality that the photo's own one seems to have, 90 where it is none.
     *
     * @return a photo that does
     */
    public PhotoBytes sourceQuality() {
        Settings changed = settings.copy();
        changed.quality = -1;
        return with(changed);
    }

    /**
     * Chooses how much colour JPEG files hold that are made; as much as the photo's own one unless
     * chosen.
     *
     * @param subsampling 444, 422 or 420
     * @return a photo that does
     * @throws IllegalArgumentException for another number
     */
    public PhotoBytes subsampling(int subsampling) {
        if (subsampling != 444 && subsampling != 422 && subsampling != 420) {
            throw new IllegalArgumentException(
                    "subsampling: is none of 444, 422, 420: " + subsampling);
        }
        Settings changed = settings.copy();
        changed.subsampling = subsampling;
        return with(changed);
    }

    /**
     * Makes PNG files instead of JPEG files; those have no quality.
     *
     * @return a photo that does
     */
    public PhotoBytes png() {
        Settings changed = settings.copy();
        changed.png = true;
        return with(changed);
    }

    /**
     * Chooses whether files that are made tell of it, by which the command knows them.
     *
     * @param mark true unless chosen
     * @return a photo that does
     */
    public PhotoBytes mark(boolean mark) {
        Settings changed = settings.copy();
        changed.mark = mark;
        return with(changed);
    }

    /**
     * Asks to be told what of the photo's metadata a file that is made of it has not.
     *
     * @param losses is given each, by the thread that makes the file, before that returns; null for
     *               nobody
     * @return a photo that tells
     */
    public PhotoBytes losses(Consumer<? super Loss> losses) {
        Settings changed = settings.copy();
        changed.losses = losses;
        return with(changed);
    }

    /**
     * Turns files that are made, beyond upright.
     *
     * @param degrees clockwise, a multiple of 90
     * @return a photo that does
     * @throws IllegalArgumentException for another angle
     */
    public PhotoBytes rotation(int degrees) {
        if (degrees % 90 != 0) {
            throw new IllegalArgumentException("rotation: is no multiple of 90: " + degrees);
        }
        Settings changed = settings.copy();
        changed.rotation = degrees % 360;
        return with(changed);
    }

    /**
     * Makes the pictures of files that are made smaller.
     *
     * @param divisor 1, 2, 4 or 8
     * @return a photo that does
     * @throws IllegalArgumentException for another divisor
     */
    public PhotoBytes scale(int divisor) {
        if (divisor != 1 && divisor != 2 && divisor != 4 && divisor != 8) {
            throw new IllegalArgumentException("scale: is not 1, 2, 4 or 8: " + divisor);
        }
        Settings changed = settings.copy();
        changed.scale = divisor;
        return with(changed);
    }

    /**
     * Takes care of faces, beside those that the file knows of: those that its XMP metadata names.
     *
     * @param faces in fractions of the upright and turned picture
     * @return a photo that does
     * @throws IllegalArgumentException when a face is null or not finite
     */
    public PhotoBytes faces(List<RectF> faces) {
        RectF[] checked = Faces.check(faces);
        Settings changed = settings.copy();
        changed.faces = new float[4 * checked.length];
        for (int i = 0; i < checked.length; ++i) {
            changed.faces[4 * i] = checked[i].left;
            changed.faces[4 * i + 1] = checked[i].top;
            changed.faces[4 * i + 2] = checked[i].right;
            changed.faces[4 * i + 3] = checked[i].bottom;
        }
        return with(changed);
    }

    /**
     * Refuses larger files, as too large.
     *
     * @param bytes at least 1; 1073741824 unless given
     * @return a photo that does
     * @throws IllegalArgumentException for less
     */
    public PhotoBytes maxBytes(long bytes) {
        Settings changed = settings.copy();
        changed.maxBytes = atLeastOne("maxBytes", bytes);
        return with(changed);
    }

    /**
     * Refuses larger pictures, as too large.
     *
     * @param pixels at least 1, of the picture as stored; unless given 268435456, or
     *               40000000 for a file of a few kB that only says to have them
     * @return a photo that does
     * @throws IllegalArgumentException for less
     */
    public PhotoBytes maxPixels(long pixels) {
        Settings changed = settings.copy();
        changed.maxPixels = atLeastOne("maxPixels", pixels);
        return with(changed);
    }

    /**
     * Refuses JPEG files of more scans, as too large.
     *
     * @param scans at least 1; 100 unless given
     * @return a photo that does
     * @throws IllegalArgumentException for less
     */
    public PhotoBytes maxScans(int scans) {
        Settings changed = settings.copy();
        changed.maxScans = (int) atLeastOne("maxScans", scans);
        return with(changed);
    }

    /**
     * Refuses JPEG files of more segments before the picture data, as too large.
     *
     * @param segments at least 1; 4096 unless given
     * @return a photo that does
     * @throws IllegalArgumentException for less
     */
    public PhotoBytes maxSegments(int segments) {
        Settings changed = settings.copy();
        changed.maxSegments = (int) atLeastOne("maxSegments", segments);
        return with(changed);
    }

    /** The same settings on another file. */
    PhotoBytes inFile(byte[] file) {
        return new PhotoBytes(file, null, 0, file.length, settings);
    }

    /** The size of a file that is known to be refused, before it is read. */
    boolean isTooLarge(long bytes) {
        return settings.maxBytes != 0 && bytes > settings.maxBytes;
    }

    private static long atLeastOne(String name, long number) {
        if (number < 1) {
            throw new IllegalArgumentException(name + ": is below 1: " + number);
        }
        return number;
    }

    /**
     * Lets another thread, or the time, give up what is asked of the photo.
     *
     * @param cancellation by which it does, such as {@link Cancellation#after}; null for nobody
     * @return a photo that can be given up
     */
    public PhotoBytes cancellation(Cancellation cancellation) {
        Settings changed = settings.copy();
        changed.cancellation = cancellation;
        return with(changed);
    }

    /**
     * Makes the automatically enhanced file.
     *
     * @param slider how much, of 0 (hardly anything) to 1; not clamped
     * @return its bytes, those that the command writes
     * @throws PhotoException           when the bytes are no photo or damaged; the kind says which
     * @throws IllegalArgumentException when the slider is not finite
     * @throws OutOfMemoryError         when memory does not suffice
     */
    public byte[] enhance(float slider) throws PhotoException {
        if (!Float.isFinite(slider)) {
            throw new IllegalArgumentException("the slider is " + slider);
        }
        return filter(Filter.AUTO, "slider=" + slider + ";");
    }

    /**
     * Makes the filtered file, with the photo's metadata as far as it still holds.
     *
     * @param filter which
     * @param params its parameters, "key=value;" items, every one with its semicolon
     * @return its bytes, those that the command writes
     * @throws PhotoException           when the bytes are no photo or damaged; the kind says which
     * @throws IllegalArgumentException when a parameter is unknown, missing or unreadable; the
     *                                  message says what the filter wants
     * @throws OutOfMemoryError         when memory does not suffice
     */
    public byte[] filter(Filter filter, String params) throws PhotoException {
        if (filter == null) {
            throw new UnknownFilterException(null);
        }
        byte[][] lost = settings.losses == null ? null : new byte[1][];
        byte[] made = call(cancel -> filter(array, buffer, offset, length, settings.quality,
                settings.subsampling, settings.rotation, settings.faces, settings.scale,
                filter.key(), params == null ? "" : params, settings.mark, cancel, lost,
                settings.maxBytes, settings.maxPixels, settings.maxScans, settings.maxSegments,
                settings.png));
        if (lost != null) {
            Loss.all(lost[0]).forEach(settings.losses);
        }
        return made;
    }

    /**
     * Reads what the file says before its picture.
     *
     * @return size, orientation and time
     * @throws PhotoException when the bytes are no photo or damaged; the kind says which
     */
    public PhotoFacts facts() throws PhotoException {
        return call(cancel -> new PhotoFacts(facts(array, buffer, offset, length,
                settings.maxBytes, settings.maxPixels, settings.maxScans, settings.maxSegments)));
    }

    /**
     * Scores how natural the picture looks (NIQE): smaller is better, from about 2.
     *
     * @return the score of the upright picture in full size; NaN when it is too small
     * @throws PhotoException when the bytes are no photo or damaged; the kind says which
     */
    public float niqe() throws PhotoException {
        return call(cancel -> niqe(array, buffer, offset, length, cancel,
                settings.maxBytes, settings.maxPixels, settings.maxScans, settings.maxSegments));
    }

    /**
     * Tells the mean features behind {@link #niqe}.
     *
     * @return 36 of them
     * @throws PhotoException when the bytes are no photo or damaged; the kind says which
     */
    public float[] niqeFeatures() throws PhotoException {
        return call(cancel -> niqeFeatures(array, buffer, offset, length, cancel,
                settings.maxBytes, settings.maxPixels, settings.maxScans, settings.maxSegments));
    }

    /**
     * Tells how the picture's green is distributed, at the scale that the command uses.
     *
     * @return what {@link Duplicates} compares
     * @throws PhotoException when the bytes are no photo or damaged; the kind says which
     */
    public GreenCdf greenCdf() throws PhotoException {
        return call(cancel -> new GreenCdf(greenCdf(array, buffer, offset, length, cancel,
                settings.maxBytes, settings.maxPixels, settings.maxScans, settings.maxSegments)));
    }

    private interface Work<T> {
        T run(long cancel) throws PhotoException;
    }

    private <T> T call(Work<T> work) throws PhotoException {
        NativeLibrary.loadPhoto();
        long cancel = Cancellation.begin(settings.cancellation);
        try {
            return work.run(cancel);
        } finally {
            Cancellation.end(settings.cancellation, cancel);
        }
    }

    // libquenby_photo.so registers these.
    static native byte[] filter(byte[] array, ByteBuffer buffer, int offset, int length,
            int quality, int subsampling, int rotation, float[] faces, int scale, String filter,
            String params, boolean mark, long cancel, byte[][] lost, long maxBytes, long maxPixels,
            int maxScans, int maxSegments, boolean png) throws PhotoException;

    private static native float niqe(byte[] array, ByteBuffer buffer, int offset, int length,
            long cancel, long maxBytes, long maxPixels, int maxScans, int maxSegments)
            throws PhotoException;

    private static native float[] niqeFeatures(byte[] array, ByteBuffer buffer, int offset,
            int length, long cancel, long maxBytes, long maxPixels, int maxScans, int maxSegments)
            throws PhotoException;

    private static native float[] greenCdf(byte[] array, ByteBuffer buffer, int offset, int length,
            long cancel, long maxBytes, long maxPixels, int maxScans, int maxSegments)
            throws PhotoException;

    private static native double[] facts(byte[] array, ByteBuffer buffer, int offset, int length,
            long maxBytes, long maxPixels, int maxScans, int maxSegments) throws PhotoException;

    static native float distance(float[] cdf1, float[] cdf2);

    static native float score(float distance, double secondsApart, boolean sameOrientation);

    static native double window(float threshold, boolean sameOrientation);

    static native String version();

    static native long newCancel();

    static native void cancel(long handle);

    static native void freeCancel(long handle);
}
