package com.pelorin.photos.quenby.autoenhance;

/** A file is no photo, is damaged, or cannot be written as a JPEG file; the kind says which. */
public class JpegException extends PhotoException {
    private static final long serialVersionUID = 1;

    /**
     * Reports a file.
     *
     * @param file  its name
     * @param cause what is wrong with its bytes
     */
    public JpegException(String file, PhotoException cause) {
        super(cause.kind(), file + ": " + cause.getMessage(), cause);
    }
}
