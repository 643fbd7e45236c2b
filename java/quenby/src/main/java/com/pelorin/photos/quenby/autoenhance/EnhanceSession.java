package com.pelorin.photos.quenby.autoenhance;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.lang.ref.Cleaner;
import java.lang.ref.Reference;
import java.util.List;
import java.util.concurrent.atomic.AtomicLong;
import java.util.logging.Logger;

/**
 * An editing session on a copy of one photo. The first use of a filter prepares it, later ones, as
 * while a slider moves, are quick. Any thread may call, several at once too, each into an output of
 * its own.
 *
 * <p>A session holds native memory, a multiple of the photo's, and wants to be closed. One that is
 * forgotten is freed when the garbage collector finds it, with a warning in the log.
 */
public final class EnhanceSession implements AutoCloseable {
    private static final Logger LOG = Logger.getLogger(EnhanceSession.class.getName());
    private static final Cleaner CLEANER = Cleaner.create();
    private static final QuenbyEngine ENGINE = new QuenbyEngine();

    private final int width;
    private final int height;
    private final Handle handle;
    private final Cleaner.Cleanable cleanable;

    /** The part of a session that outlives it, so it must not refer to it. */
    private static final class Handle implements Runnable {
        final AtomicLong value;
        private volatile boolean closed;

        Handle(long value) {
            this.value = new AtomicLong(value);
        }

        /** Runs once: at {@code close}, or when a forgotten session is found. */
        @Override
        public void run() {
            if (!closed) {
                LOG.warning("an EnhanceSession was never closed; its memory is freed only now");
            }
            ENGINE.releaseSession(value.getAndSet(0));
        }

        long get() {
            long current = value.get();
            if (current == 0) {
                throw new SessionClosedException();
            }
            return current;
        }
    }

    private EnhanceSession(long handle, int width, int height) {
        this.handle = new Handle(handle);
        this.width = width;
        this.height = height;
        this.cleanable = CLEANER.register(this, this.handle);
    }

    /**
     * Opens a session on a photo without faces.
     *
     * @param photo of ARGB_8888; may change or be recycled afterwards
     * @return the session, to be closed
     * @throws UnsuitableBitmapException for another bitmap
     * @throws OutOfMemoryError          when the copy does not fit into memory
     */
    public static EnhanceSession open(Bitmap photo) {
        return open(photo, List.of());
    }

    /**
     * Opens a session on a photo with faces, which enhancement takes care of.
     *
     * @param photo of ARGB_8888; may change or be recycled afterwards
     * @param faces in fractions of the photo's width and height
     * @return the session, to be closed
     * @throws UnsuitableBitmapException for another bitmap
     * @throws IllegalArgumentException  when a face is null or not finite
     * @throws OutOfMemoryError          when memory does not suffice
     */
    public static EnhanceSession open(Bitmap photo, List<RectF> faces) {
        Bitmaps.requireReadable(photo, "the photo");
        RectF[] checked = Faces.check(faces);
        long handle = ENGINE.init(photo);
        if (handle == 0) { // recycled meanwhile
            throw new UnsuitableBitmapException("the photo's pixels cannot be read");
        }
        try {
            ENGINE.preprocess(checked, handle);
        } catch (Throwable error) {
            ENGINE.releaseSession(handle);
            throw error;
        }
        return new EnhanceSession(handle, photo.getWidth(), photo.getHeight());
    }

    /**
     * Replaces the faces. Filters prepared before are prepared anew at their next use.
     *
     * @param faces in fractions of the photo's width and height
     * @throws IllegalArgumentException when a face is null or not finite
     * @throws SessionClosedException   after {@link #close}
     * @throws OutOfMemoryError         when memory does not suffice; the faces are then as before
     */
    public void setFaces(List<RectF> faces) {
        RectF[] checked = Faces.check(faces);
        try {
            ENGINE.preprocess(checked, handle.get());
        } finally {
            Reference.reachabilityFence(this);
        }
    }

    /**
     * Writes the automatically enhanced photo into a bitmap.
     *
     * @param slider how much, of 0 (hardly anything) to 1; not clamped
     * @param output of ARGB_8888 and the photo's size; may be the photo
     * @throws UnsuitableBitmapException for another bitmap
     * @throws IllegalArgumentException  when the slider is not finite
     * @throws SessionClosedException    after {@link #close}
     * @throws OutOfMemoryError          when memory does not suffice; the output is then as it was
     */
    public void enhance(float slider, Bitmap output) {
        if (!Float.isFinite(slider)) {
            throw new IllegalArgumentException("the slider is " + slider);
        }
        apply(Filter.AUTO, "slider=" + slider + ";", output);
    }

    /**
     * Writes the filtered photo into a bitmap.
     *
     * @param filter which filter
     * @param params its parameters, "key=value;" items, every one with its semicolon
     * @param output of ARGB_8888 and the photo's size; may be the photo
     * @throws UnsuitableBitmapException for another bitmap
     * @throws IllegalArgumentException  when a required parameter is missing or unreadable
     * @throws SessionClosedException    after {@link #close}
     * @throws OutOfMemoryError          when memory does not suffice; the output is then as it was
     */
    public void apply(Filter filter, String params, Bitmap output) {
        if (filter == null) {
            throw new UnknownFilterException(null);
        }
        Bitmaps.requireRoomFor(width, height, output);
        try {
            ENGINE.applyAutoEnhanceFilter(handle.get(), output, filter.key(), params);
        } finally {
            Reference.reachabilityFence(this);
        }
    }

    /**
     * Writes the filtered photo into a bitmap.
     *
     * @param filter the key of a filter, such as "AE0"
     * @param params as above
     * @param output as above
     * @throws UnknownFilterException    when no filter has that key
     * @throws UnsuitableBitmapException for another bitmap
     * @throws IllegalArgumentException  when a required parameter is missing or unreadable
     * @throws SessionClosedException    after {@link #close}
     * @throws OutOfMemoryError          when memory does not suffice; the output is then as it was
     */
    public void apply(String filter, String params, Bitmap output) {
        apply(Filter.of(filter), params, output);
    }

    /**
     * Tells the photo's width.
     *
     * @return pixels in a row
     */
    public int getWidth() {
        return width;
    }

    /**
     * Tells the photo's height.
     *
     * @return rows
     */
    public int getHeight() {
        return height;
    }

    /** Frees the session once calls at work in other threads are done. Again does nothing. */
    @Override
    public void close() {
        handle.closed = true;
        cleanable.clean();
    }
}
