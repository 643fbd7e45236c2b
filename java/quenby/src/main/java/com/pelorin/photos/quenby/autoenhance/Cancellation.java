package com.pelorin.photos.quenby.autoenhance;

import java.util.HashSet;
import java.util.Set;
import java.util.concurrent.CancellationException;

/**
 * A way to give work up from another thread. Work that was given one throws
 * {@link CancellationException} soon after {@link #cancel}, and at once when that came before it;
 * how soon, its methods say. One may serve any number of calls; any thread may call.
 */
public final class Cancellation {
    private final Set<Long> atWork = new HashSet<>();
    private boolean cancelled;

    /** Makes one that is not cancelled. */
    public Cancellation() {}

    /** Gives all work up that was given this, now and later. Again does nothing. */
    public synchronized void cancel() {
        cancelled = true;
        for (long handle : atWork) {
            PhotoBytes.cancel(handle);
        }
    }

    /**
     * Tells whether work is given up.
     *
     * @return true after {@link #cancel}
     */
    public synchronized boolean isCancelled() {
        return cancelled;
    }

    static void checkBefore(Cancellation cancellation) {
        check(cancellation, "cancelled before it began");
    }

    /** For work that cannot be interrupted. */
    static void checkAfter(Cancellation cancellation) {
        check(cancellation, "cancelled while it was at work");
    }

    private static void check(Cancellation cancellation, String message) {
        if (cancellation != null && cancellation.isCancelled()) {
            throw new CancellationException(message);
        }
    }

    /** The handle for one call of a bytes native, 0 without a cancellation; to be ended. */
    static long begin(Cancellation cancellation) {
        if (cancellation == null) {
            return 0;
        }
        synchronized (cancellation) {
            checkBefore(cancellation);
            long handle = PhotoBytes.newCancel();
            cancellation.atWork.add(handle);
            return handle;
        }
    }

    static void end(Cancellation cancellation, long handle) {
        if (cancellation == null) {
            return;
        }
        synchronized (cancellation) {
            cancellation.atWork.remove(handle);
        }
        PhotoBytes.freeCancel(handle);
    }
}
