package com.pelorin.photos.quenby.autoenhance;

import java.io.IOException;

/** A file is no JPEG file, is damaged, or cannot be turned or written as one. */
public class JpegException extends IOException {
    private static final long serialVersionUID = 1;

    /**
     * Reports a file.
     *
     * @param message what is wrong with it
     * @param cause   what the native library raised, or null
     */
    public JpegException(String message, Throwable cause) {
        super(message, cause);
    }
}
