package com.pelorin.photos.quenby.autoenhance;

import android.graphics.Bitmap;
import android.graphics.RectF;
import java.lang.ref.PhantomReference;
import java.lang.ref.Reference;
import java.lang.ref.ReferenceQueue;
import java.util.Collections;
import java.util.HashSet;
import java.util.List;
import java.util.Set;
import java.util.logging.Logger;

/**
 * An editing session on a copy of one photo. The first use of a filter prepares it, later ones, as
 * while a slider moves, are quick. Any thread may call, several at once too, each into an output of
 * its own.
 *
 * <p>A session holds native memory, a multiple of the photo's, and wants to be closed. One that is
 * forgotten is freed, with a warning in the log, when a session is opened or closed after the
 * garbage collector has found it; no thread waits for that.
 */
public final class EnhanceSession implements AutoCloseable {
    private static final Logger LOG = Logger.getLogger(EnhanceSession.class.getName());
    private static final QuenbyEngine ENGINE = new QuenbyEngine();
    private static final ReferenceQueue<EnhanceSession> UNREACHABLE = new ReferenceQueue<>();
    /** A reference that nobody holds is never queued. */
    private static final Set<Handle> OPEN = Collections.synchronizedSet(new HashSet<>());

    private final int width;
    private final int height;
    private final Handle handle;

    /**
     * The part of a session that outlives it. The native session is released when it is closed and
     * no call uses it, so a call that has begun never meets a released one.
     */
    private static final class Handle extends PhantomReference<EnhanceSession> {
        private final long value;
        private int calls;
        private boolean closed;

        Handle(EnhanceSession session, long value) {
            super(session, UNREACHABLE);
            this.value = value;
            OPEN.add(this);
        }

        /** To be followed by {@link #endCall}. */
        synchronized long beginCall() {
            if (closed) {
                throw new SessionClosedException();
            }
            ++calls;
            return value;
        }

        void endCall() {
            boolean last;
            synchronized (this) {
                last = --calls == 0 && closed;
            }
            if (last) {
                ENGINE.releaseSession(value);
            }
        }

        void close() {
            OPEN.remove(this);
            boolean last;
            synchronized (this) {
                last = calls == 0 && !closed;
                closed = true;
            }
            if (last) {
                ENGINE.releaseSession(value);
            }
        }
    }

    private EnhanceSession(long handle, int width, int height) {
        this.handle = new Handle(this, handle);
        this.width = width;
        this.height = height;
    }

    private static void closeForgotten() {
        for (Reference<?> found; (found = UNREACHABLE.poll()) != null;) {
            LOG.warning("an EnhanceSession was never closed; its memory is freed only now");
            ((Handle) found).close();
        }
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
        return open(photo, Collections.emptyList());
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
        NativeLibrary.load();
        closeForgotten();
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
        long session = handle.beginCall();
        try {
            ENGINE.preprocess(checked, session);
        } finally {
            handle.endCall();
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
     * Writes the filtered photo into a bitmap. When this returns, it is written; a call that comes
     * too late, while another thread closes the session or recycles the output, throws.
     *
     * @param filter which filter
     * @param params its parameters, "key=value;" items, every one with its semicolon
     * @param output of ARGB_8888 and the photo's size; may be the photo
     * @throws UnsuitableBitmapException for another bitmap
     * @throws IllegalArgumentException  when a parameter is unknown, missing or unreadable; the
     *                                   message says what the filter wants
     * @throws SessionClosedException    after {@link #close}
     * @throws OutOfMemoryError          when memory does not suffice; the output is then as it was
     */
    public void apply(Filter filter, String params, Bitmap output) {
        apply(filter, params, output, null);
    }

    /**
     * Writes the filtered photo into a bitmap unless another thread gives it up. That is looked for
     * before the filter begins and after it has ended; the filter itself runs to its end, which for
     * the first use of {@link Filter#AUTO} on a large photo may be a second.
     *
     * @param filter       which filter
     * @param params       as above
     * @param output       as above
     * @param cancellation by which it is given up; null for not at all
     * @throws UnsuitableBitmapException for another bitmap
     * @throws IllegalArgumentException  when a parameter is unknown, missing or unreadable; the
     *                                   message says what the filter wants
     * @throws SessionClosedException    after {@link #close}
     * @throws java.util.concurrent.CancellationException when it was given up before this returned;
     *                                   what the output holds then is not to be relied on, and the
     *                                   session is as good as before
     * @throws OutOfMemoryError          when memory does not suffice; the output is then as it was
     */
    public void apply(Filter filter, String params, Bitmap output, Cancellation cancellation) {
        if (filter == null) {
            throw new UnknownFilterException(null);
        }
        filter.check(params);
        Bitmaps.requireRoomFor(width, height, output);
        Cancellation.checkBefore(cancellation);
        long session = handle.beginCall();
        try {
            ENGINE.applyAutoEnhanceFilter(session, output, filter.key(), params);
        } finally {
            handle.endCall();
        }
        Cancellation.checkAfter(cancellation);
        if (output.isRecycled()) { // meanwhile, perhaps before it was written
            throw new UnsuitableBitmapException("the output was recycled by another thread");
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
     * @throws IllegalArgumentException  when a parameter is unknown, missing or unreadable; the
     *                                   message says what the filter wants
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

    /**
     * Ends the session. Calls that are at work in other threads finish, and the last of them frees
     * its memory; those that come later throw. Again does nothing.
     */
    @Override
    public void close() {
        handle.close();
        closeForgotten();
    }
}
