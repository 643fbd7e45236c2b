package com.pelorin.photos.quenby.autoenhance;

import java.nio.charset.StandardCharsets;
import java.util.ArrayList;
import java.util.List;

/** Something of a photo's metadata that a file made of it has not. Immutable. */
public final class Loss {
    private final String what;
    private final String why;

    private Loss(String what, String why) {
        this.what = what;
        this.why = why;
    }

    /** What and why of each, a zero behind either. */
    static List<Loss> all(byte[] told) {
        String[] parts = new String(told, StandardCharsets.UTF_8).split("\0", -1);
        List<Loss> losses = new ArrayList<>();
        for (int i = 0; i + 2 < parts.length; i += 2) {
            losses.add(new Loss(parts[i], parts[i + 1]));
        }
        return losses;
    }

    /**
     * Names it.
     *
     * @return for a user: "C2PA manifest"
     */
    public String what() {
        return what;
    }

    /**
     * Tells the reason.
     *
     * @return one clause: "an edit breaks its signature"
     */
    public String why() {
        return why;
    }

    @Override
    public String toString() {
        return what + " lost: " + why;
    }
}
