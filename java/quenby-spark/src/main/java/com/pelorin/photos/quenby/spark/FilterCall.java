package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.Filter;
import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import com.pelorin.photos.quenby.autoenhance.PhotoException;
import java.io.Serializable;
import java.util.EnumSet;
import java.util.Locale;
import java.util.stream.Collectors;

/** A filter with its parameters and the quality of the file. */
final class FilterCall implements Serializable {
    private static final long serialVersionUID = 1;
    private static final String QUALITY = "quality=";
    private static final EnumSet<Filter> LOOKS = EnumSet.complementOf(
            EnumSet.of(Filter.AUTO, Filter.AUTO_8BIT, Filter.ORIGINAL));

    private final Filter filter;
    private final String params;
    /** "85", "auto"; empty for the usual. */
    private final String quality;

    private FilterCall(Filter filter, String params, String quality) {
        this.filter = filter;
        this.params = params;
        this.quality = quality;
    }

    /**
     * Reads parameters, "slider=0.4;quality=85;".
     *
     * @throws IllegalArgumentException when one is unknown, missing or unreadable
     */
    static FilterCall of(Filter filter, String text) {
        String params = text == null ? "" : text;
        String quality = "";
        if (params.contains(QUALITY)) {
            StringBuilder others = new StringBuilder();
            for (String item : params.split(";")) {
                if (item.startsWith(QUALITY)) {
                    quality = item.substring(QUALITY.length());
                } else if (!item.isEmpty()) {
                    others.append(item).append(';');
                }
            }
            params = others.toString();
        }
        filter.check(params);
        FilterCall call = new FilterCall(filter, params, quality);
        call.settings(PhotoBytes.of(new byte[0])); // refuses the quality
        return call;
    }

    /** The look that users know under this name, whatever its case, or the filter of this key. */
    static Filter look(String name) {
        for (Filter look : LOOKS) {
            if (look.displayName().equalsIgnoreCase(name) || look.key().equals(name)) {
                return look;
            }
        }
        throw new IllegalArgumentException("there is no look '" + name + "'; looks are "
                + LOOKS.stream().map(look -> look.displayName().toLowerCase(Locale.ROOT))
                        .collect(Collectors.joining(", ")));
    }

    byte[] apply(PhotoBytes photo) throws PhotoException {
        return settings(photo).filter(filter, params);
    }

    private PhotoBytes settings(PhotoBytes photo) {
        if (quality.isEmpty()) {
            return photo;
        }
        if (quality.equals("auto")) {
            return photo.sourceQuality();
        }
        try {
            return photo.quality(Integer.parseInt(quality));
        } catch (NumberFormatException error) {
            throw new IllegalArgumentException(
                    "quality: is neither auto nor from 1 to 100: " + quality, error);
        }
    }

    /** Equal for equal calls; what a manifest has of it. */
    @Override
    public String toString() {
        return filter.key() + ": " + params + (quality.isEmpty() ? "" : QUALITY + quality + ";");
    }
}
