package com.pelorin.photos.quenby.autoenhance;

import java.time.Duration;
import java.util.HashMap;
import java.util.Map;
import java.util.concurrent.CancellationException;
import java.util.concurrent.Future;
import java.util.concurrent.ScheduledThreadPoolExecutor;
import java.util.concurrent.TimeUnit;

/**
 * A way to give work up from another thread, or when its time is over. Work that was given one throws
 * {@link CancellationException} soon after {@link #cancel}, and at once when that came before it;
 * how soon, its methods say. One may serve any number of calls; any thread may call.
 */
public final class Cancellation {
    /** For each call its alarm, null without a time. */
    private final Map<Long, Future<?>> atWork = new HashMap<>();
    private final boolean isTimed;
    private final long end; // by System.nanoTime
    private boolean cancelled;

    /** Makes one that is not cancelled. */
    public Cancellation() {
        isTimed = false;
        end = 0;
    }

    private Cancellation(long nanoseconds) {
        isTimed = true;
        end = System.nanoTime() + nanoseconds;
    }

    /**
     * Makes one that is cancelled by itself when a time has gone by, whatever is at work then.
     *
     * @param time from this call on; none, or less than none, for at once
     * @return the cancellation
     */
    public static Cancellation after(Duration time) {
        // Half of what a long holds, so that times can be subtracted: 146 years.
        Duration most = Duration.ofNanos(Long.MAX_VALUE / 2);
        Duration least = Duration.ZERO;
        return new Cancellation((time.compareTo(most) > 0 ? most
                : time.compareTo(least) < 0 ? least : time).toNanos());
    }

    /** Gives all work up that was given this, now and later. Again does nothing. */
    public synchronized void cancel() {
        cancelled = true;
        for (long handle : atWork.keySet()) {
            PhotoBytes.cancel(handle);
        }
    }

    /**
     * Tells whether work is given up.
     *
     * @return true after {@link #cancel}, and when the time is over
     */
    public synchronized boolean isCancelled() {
        return cancelled || (isTimed && end - System.nanoTime() <= 0);
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
            try {
                cancellation.atWork.put(handle, cancellation.alarm(handle));
                return handle;
            } catch (Throwable error) {
                PhotoBytes.freeCancel(handle);
                throw error;
            }
        }
    }

    static void end(Cancellation cancellation, long handle) {
        if (cancellation == null) {
            return;
        }
        Future<?> alarm;
        synchronized (cancellation) {
            alarm = cancellation.atWork.remove(handle);
        }
        if (alarm != null) {
            alarm.cancel(false);
        }
        PhotoBytes.freeCancel(handle);
    }

    private Future<?> alarm(long handle) {
        return isTimed ? Clock.ALARMS.schedule(() -> PhotoBytes.cancel(handle),
                end - System.nanoTime(), TimeUnit.NANOSECONDS) : null;
    }

    /** A thread for all alarms, which ends when there has been none for a while. */
    private static final class Clock {
        static final ScheduledThreadPoolExecutor ALARMS =
                new ScheduledThreadPoolExecutor(1, work -> {
                    Thread thread = new Thread(work, "quenby time limits");
                    thread.setDaemon(true);
                    return thread;
                });

        static {
            ALARMS.setKeepAliveTime(1, TimeUnit.SECONDS);
            ALARMS.allowCoreThreadTimeOut(true);
            ALARMS.setRemoveOnCancelPolicy(true);
        }
    }
}
