package com.pelorin.photos.quenby.autoenhance;

import java.nio.ByteBuffer;
import java.nio.ByteOrder;
import java.util.Arrays;

/**
 * How the green of a photo is distributed, all that {@link Duplicates} needs of its picture: 1 KiB
 * that can be kept in place of decoding it again. Immutable.
 */
public final class GreenCdf {
    /** The length of {@link #toBytes}. */
    public static final int BYTES = 1024;

    private final float[] values;

    GreenCdf(float[] values) {
        this.values = values;
    }

    /**
     * Takes one from where it was kept.
     *
     * @param bytes what {@link #toBytes} gave
     * @return the distribution
     * @throws IllegalArgumentException for other bytes
     */
    public static GreenCdf fromBytes(byte[] bytes) {
        if (bytes.length != BYTES) {
            throw new IllegalArgumentException(
                    "a green CDF takes " + BYTES + " bytes, not " + bytes.length);
        }
        float[] values = new float[BYTES / 4];
        ByteBuffer.wrap(bytes).order(ByteOrder.LITTLE_ENDIAN).asFloatBuffer().get(values);
        float before = 0;
        for (float value : values) {
            if (!(value >= before && value <= 1.001f)) { // a sum of floats may pass 1
                throw new IllegalArgumentException("no CDF: " + value + " after " + before);
            }
            before = value;
        }
        return new GreenCdf(values);
    }

    /**
     * Gives it in a form to keep, the same on every machine.
     *
     * @return {@link #BYTES} bytes: floats, little endian
     */
    public byte[] toBytes() {
        ByteBuffer bytes = ByteBuffer.allocate(BYTES).order(ByteOrder.LITTLE_ENDIAN);
        bytes.asFloatBuffer().put(values);
        return bytes.array();
    }

    /**
     * Tells how far apart two photos are whatever their exposure.
     *
     * @param other the other photo's
     * @return the distance, of 0 to 1; not quite 0 for the same
     */
    public float distanceTo(GreenCdf other) {
        NativeLibrary.loadPhoto();
        return PhotoBytes.distance(values, other.values);
    }

    @Override
    public boolean equals(Object other) {
        return other instanceof GreenCdf && Arrays.equals(values, ((GreenCdf) other).values);
    }

    @Override
    public int hashCode() {
        return Arrays.hashCode(values);
    }
}
