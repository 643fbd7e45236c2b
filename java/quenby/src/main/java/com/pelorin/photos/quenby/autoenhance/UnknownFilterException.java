package com.pelorin.photos.quenby.autoenhance;

/** No filter has that name. */
public class UnknownFilterException extends IllegalArgumentException {
    private static final long serialVersionUID = 1;

    /**
     * Reports a name.
     *
     * @param name the name that no filter has
     */
    public UnknownFilterException(String name) {
        super("no filter is called " + (name == null ? "null" : '"' + name + '"'));
    }
}
