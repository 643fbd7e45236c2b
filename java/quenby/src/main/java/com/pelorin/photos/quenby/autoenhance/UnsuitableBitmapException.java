package com.pelorin.photos.quenby.autoenhance;

/** A bitmap is null, recycled, not of ARGB_8888 or too small. */
public class UnsuitableBitmapException extends IllegalArgumentException {
    private static final long serialVersionUID = 1;

    /**
     * Reports a bitmap.
     *
     * @param message what is wrong with it
     */
    public UnsuitableBitmapException(String message) {
        super(message);
    }
}
