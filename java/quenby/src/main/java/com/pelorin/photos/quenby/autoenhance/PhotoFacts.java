package com.pelorin.photos.quenby.autoenhance;

import java.util.OptionalDouble;

/** What a photo's file says before its picture. Immutable. */
public final class PhotoFacts {
    private final int width;
    private final int height;
    private final int orientation;
    private final double wallClock;
    private final double utc;

    PhotoFacts(double[] values) {
        width = (int) values[0];
        height = (int) values[1];
        orientation = (int) values[2];
        wallClock = values[3];
        utc = values[4];
    }

    /**
     * Tells the width as it is stored, before turning.
     *
     * @return pixels in a row
     */
    public int width() {
        return width;
    }

    /**
     * Tells the height as it is stored, before turning.
     *
     * @return rows
     */
    public int height() {
        return height;
    }

    /**
     * Tells how the stored picture is to be turned.
     *
     * @return the EXIF orientation, 1 to 8; 1 is upright
     */
    public int orientation() {
        return orientation;
    }

    /**
     * Tells when the photo was taken by the clock on the wall.
     *
     * @return seconds from 1970, as if that clock showed UTC; empty when the file does not say
     */
    public OptionalDouble wallClockSeconds() {
        return known(wallClock);
    }

    /**
     * Tells when the photo was taken.
     *
     * @return seconds of UTC from 1970; empty when the file names no time or no zone
     */
    public OptionalDouble utcSeconds() {
        return known(utc);
    }

    private static OptionalDouble known(double seconds) {
        return Double.isNaN(seconds) ? OptionalDouble.empty() : OptionalDouble.of(seconds);
    }
}
