package com.pelorin.photos.quenby.autoenhance;

import java.util.Arrays;
import java.util.List;
import java.util.regex.Pattern;

/**
 * The keys of a filter's parameter string, for a message that says which key wants what. Refuses
 * what the bytes natives refuse, with the same words: unknown keys, and what the filter would throw
 * for.
 */
final class FilterKeys {
    static final FilterKeys NONE = new FilterKeys(true, false);
    /** Of automatic enhancement, which requires the first and reads it strictly. */
    static final FilterKeys ENHANCEMENT =
            new FilterKeys(true, true, "slider", "gtmOnly", "gtmExtraMemory");
    /** Of looks. */
    static final FilterKeys LOOK = new FilterKeys(false, false, "maskRadius", "maskAlpha",
            "applyMask", "r", "g", "b");
    /** Of the look by four parameters. */
    static final FilterKeys CURVE = new FilterKeys(false, false, "maskRadius", "maskAlpha",
            "applyMask", "r", "g", "b", "s1", "s2", "s3", "s4");

    private static final Pattern NUMBER = Pattern.compile(
            "[+-]?(?:(?:[0-9]+\\.?[0-9]*|\\.[0-9]+)(?:[eE][+-]?[0-9]+)?|(?i:inf(?:inity)?|nan))");
    private static final String STRENGTH = "a number from 0 to 1";

    /** Whether text after the last ";" counts. */
    private final boolean endCounts;
    /** Whether the first is required and a number. */
    private final boolean firstRequired;
    private final List<String> keys;

    private FilterKeys(boolean endCounts, boolean firstRequired, String... keys) {
        this.endCounts = endCounts;
        this.firstRequired = firstRequired;
        this.keys = Arrays.asList(keys);
    }

    List<String> names() {
        return keys;
    }

    /** Throws IllegalArgumentException for the first fault. */
    void check(String filter, String params) {
        String text = params == null ? "" : params;
        boolean given = false;
        for (int start = 0; start < text.length();) {
            int end = text.indexOf(';', start);
            if (end < 0 && !endCounts) {
                break;
            }
            String item = text.substring(start, end < 0 ? text.length() : end);
            start += item.length() + 1;
            if (item.isEmpty()) {
                continue;
            }
            int equals = item.indexOf('=');
            String key = equals < 0 ? item : item.substring(0, equals);
            if (!keys.contains(key)) {
                throw new IllegalArgumentException("params: " + unknown(filter, key));
            }
            if (firstRequired && equals >= 0 && key.equals(keys.get(0))) {
                given = true;
                String value = item.substring(equals + 1);
                if (!isNumber(value)) {
                    throw new IllegalArgumentException("params: " + key + " of " + filter
                            + " wants " + STRENGTH + "; '" + value + "' is no number");
                }
            }
        }
        if (firstRequired && !given) {
            throw new IllegalArgumentException("params: " + filter + " needs " + keys.get(0) + ", "
                    + STRENGTH + ", for example \"" + keys.get(0) + "=0.4;\"");
        }
    }

    private String unknown(String filter, String key) {
        if (keys.isEmpty()) {
            return filter + " takes no parameters";
        }
        int last = keys.size() - 1;
        return filter + " has no parameter '" + key + "'; it takes "
                + String.join(", ", keys.subList(0, last)) + " and " + keys.get(last);
    }

    private static boolean isNumber(String text) {
        if (!NUMBER.matcher(text).matches()) {
            return false;
        }
        boolean spelled = Character.isLetter(text.charAt(text.length() - 1)); // "inf"
        return spelled || !Float.isInfinite(Float.parseFloat(text)); // too large for a float
    }
}
