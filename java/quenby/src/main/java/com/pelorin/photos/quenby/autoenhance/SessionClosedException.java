package com.pelorin.photos.quenby.autoenhance;

/** A session was used after it was closed. */
public class SessionClosedException extends IllegalStateException {
    private static final long serialVersionUID = 1;

    /** Reports a use. */
    public SessionClosedException() {
        super("the session is closed");
    }
}
