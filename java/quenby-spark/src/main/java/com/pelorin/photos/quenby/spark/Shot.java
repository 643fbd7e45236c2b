package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.GreenCdf;
import java.util.Arrays;

/** A photo as the search for near-duplicates sees it. */
final class Shot implements Comparable<Shot> {
    final String path;
    final double wallClock;
    /** NaN where it is not known. */
    final double utc;
    final int orientation;
    final GreenCdf cdf;
    private final byte[] order;

    Shot(String path, double wallClock, double utc, int orientation, GreenCdf cdf) {
        this.path = path;
        this.wallClock = wallClock;
        this.utc = utc;
        this.orientation = orientation;
        this.cdf = cdf;
        this.order = PathOrder.key(path);
    }

    boolean hasUtc() {
        return !Double.isNaN(utc);
    }

    /** Without both offsets the wall clocks are compared. */
    double secondsTo(Shot other) {
        return Math.abs(hasUtc() && other.hasUtc() ? utc - other.utc : wallClock - other.wallClock);
    }

    @Override
    public int compareTo(Shot other) {
        return Arrays.compareUnsigned(order, other.order);
    }

    @Override
    public boolean equals(Object other) {
        return other instanceof Shot && path.equals(((Shot) other).path);
    }

    @Override
    public int hashCode() {
        return path.hashCode();
    }
}
