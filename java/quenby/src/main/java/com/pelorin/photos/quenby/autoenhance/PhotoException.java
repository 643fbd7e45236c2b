package com.pelorin.photos.quenby.autoenhance;

import java.io.IOException;

/** A photo cannot be read, or a file cannot be made of it. */
public class PhotoException extends IOException {
    private static final long serialVersionUID = 1;

    /** Why. */
    public enum Kind {
        // In the order of the native library's.
        /** There are no bytes at all. */
        EMPTY,
        /** The bytes are of no format known here: no JPEG file, for one. */
        NOT_A_PHOTO,
        /** The format is known, but this kind of it cannot be read. */
        UNSUPPORTED,
        /** The bytes break the rules of their format. */
        DAMAGED,
        /** The bytes are the beginning of a photo. */
        TRUNCATED,
        /** It is more work than the limits allow. */
        TOO_LARGE,
        /** What is asked for does not exist, such as a JPEG file 70000 pixels wide. */
        INVALID_REQUEST
    }

    /** What is wrong with the photo. */
    private final Kind kind;

    /**
     * Reports a photo.
     *
     * @param kind    why
     * @param message the reason in words
     * @param cause   what was raised for its bytes, or null
     */
    public PhotoException(Kind kind, String message, Throwable cause) {
        super(message, cause);
        this.kind = kind;
    }

    // Called by the natives.
    PhotoException(int kind, String message) {
        this(Kind.values()[kind], message, null);
    }

    /**
     * Tells why.
     *
     * @return the kind of failure
     */
    public Kind kind() {
        return kind;
    }
}
