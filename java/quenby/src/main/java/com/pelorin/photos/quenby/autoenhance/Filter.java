package com.pelorin.photos.quenby.autoenhance;

/** The filters there are. */
public enum Filter {
    /** Automatic enhancement. Requires "slider=0.4;", of 0 to 1. */
    AUTO("AE0", "Auto", FilterKeys.ENHANCEMENT),
    /** Automatic enhancement in less memory. Requires "slider=0.4;", of 0 to 1. */
    AUTO_8BIT("AE08bit", "Auto", FilterKeys.ENHANCEMENT),
    /** Black and white with a vignette. */
    SNOW("ZebraBW", "Snow", FilterKeys.LOOK),
    /** Light with hints of raspberry. */
    SUMMER("SummerRGB", "Summer", FilterKeys.LOOK),
    /** Warm with a vignette. */
    SPRING("SpringRGB", "Spring", FilterKeys.LOOK),
    /** Bright and energetic. */
    FALL("FallRGB", "Fall", FilterKeys.LOOK),
    /** As from an old print. */
    VINTAGE("VintageRGB", "Vintage", FilterKeys.LOOK),
    /** Cool with a vignette. */
    WINTER("WinterRGB", "Winter", FilterKeys.LOOK),
    /** Curves by four parameters "s1" to "s4" of 0 to 1; 0.5 each changes least. */
    STARFISH("LowDimRGBCurve", "StarFish", FilterKeys.CURVE),
    /** The photo as it is. */
    ORIGINAL("PassThrough", "Original", FilterKeys.NONE);

    private final String key;
    private final String displayName;
    private final FilterKeys keys;

    Filter(String key, String displayName, FilterKeys keys) {
        this.key = key;
        this.displayName = displayName;
        this.keys = keys;
    }

    FilterKeys keys() {
        return keys;
    }

    /**
     * Tells the name by which the native library knows the filter.
     *
     * @return the name, such as "AE0"
     */
    public String key() {
        return key;
    }

    /**
     * Tells the name to show to users; several filters may share one.
     *
     * @return the name, such as "Auto"
     */
    public String displayName() {
        return displayName;
    }

    /**
     * Checks a parameter string, in the words that {@link PhotoBytes#filter} would use: where many
     * photos are to be filtered, before the first one.
     *
     * @param params "key=value;" items, every one with its semicolon; null is none
     * @throws IllegalArgumentException when a parameter is unknown, missing or unreadable; the
     *                                  message says what the filter wants
     */
    public void check(String params) {
        keys.check(key, params);
    }

    /**
     * Finds a filter by its key.
     *
     * @param key exactly as {@link #key} gives it
     * @return the filter
     * @throws UnknownFilterException when there is none
     */
    public static Filter of(String key) {
        for (Filter filter : values()) {
            if (filter.key.equals(key)) {
                return filter;
            }
        }
        throw new UnknownFilterException(key);
    }
}
