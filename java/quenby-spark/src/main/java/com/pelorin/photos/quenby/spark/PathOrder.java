package com.pelorin.photos.quenby.spark;

import java.nio.charset.StandardCharsets;
import java.util.Arrays;

/** The order of photos that the command has: by the bytes of each folder's name in turn. */
final class PathOrder {
    private PathOrder() {}

    static int compare(String a, String b) {
        return Arrays.compareUnsigned(key(a), key(b));
    }

    /** A folder's end comes before every letter, so that "a/b" stands before "a-b". */
    static byte[] key(String path) {
        return path.replace('/', '\0').getBytes(StandardCharsets.UTF_8);
    }
}
