package com.pelorin.photos.quenby.spark;

import com.pelorin.photos.quenby.autoenhance.Cancellation;
import com.pelorin.photos.quenby.autoenhance.PhotoBytes;
import java.io.IOException;
import java.io.Serializable;
import java.time.Duration;
import java.util.Map;
import java.util.Set;
import java.util.concurrent.CancellationException;

/** What a photo of a job may cost at most: the command's limits, with its options and defaults. */
final class PhotoLimits implements Serializable {
    private static final long serialVersionUID = 1;
    private static final Map<String, Long> UNITS =
            Map.of("", 1L, "k", 1_000L, "M", 1_000_000L, "G", 1_000_000_000L);
    private static final long USUAL_BYTES = 1L << 30;

    /** Options that jobs of every verb have. */
    static final Set<String> OPTIONS = Set.of(
            "--max-bytes", "--max-pixels", "--max-scans", "--max-segments", "--timeout");

    private final long bytes;
    private final long pixels; // 0: what the natives have, here and below
    private final int scans;
    private final int segments;
    private final long seconds; // 0: as long as it takes

    private PhotoLimits(Map<String, String> options) {
        bytes = number(options, "--max-bytes", 1, USUAL_BYTES);
        pixels = number(options, "--max-pixels", 1, 0);
        scans = count(options, "--max-scans");
        segments = count(options, "--max-segments");
        seconds = number(options, "--timeout", 0, 0);
    }

    /**
     * Reads options.
     *
     * @throws IllegalArgumentException when one is no number
     */
    static PhotoLimits of(Map<String, String> options) {
        return new PhotoLimits(options);
    }

    private static int count(Map<String, String> options, String option) {
        return (int) Math.min(number(options, option, 1, 0), Integer.MAX_VALUE);
    }

    private static long number(Map<String, String> options, String option, long least,
            long usual) {
        String text = options.get(option);
        if (text == null) {
            return usual;
        }
        String digits = text.replaceAll("[kMG]$", "");
        try {
            long number = Math.multiplyExact(
                    Long.parseLong(digits), UNITS.get(text.substring(digits.length())));
            if (number >= least) {
                return number;
            }
        } catch (ArithmeticException | NumberFormatException error) {
            // Falls through: as bad as a number that is too small.
        }
        throw new IllegalArgumentException(
                option + ": is no number from " + least + " on, such as 20 or 40M: " + text);
    }

    /** Of a file. */
    long bytes() {
        return bytes;
    }

    /** What is done with a photo. */
    interface Work<T> {
        T run(PhotoBytes photo) throws IOException;
    }

    /**
     * Works on a photo within the limits.
     *
     * @throws IOException what the work throws; and when the photo is beyond a limit
     */
    <T> T apply(byte[] content, Work<T> work) throws IOException {
        PhotoBytes photo = PhotoBytes.of(content).maxBytes(bytes);
        if (pixels > 0) {
            photo = photo.maxPixels(pixels);
        }
        if (scans > 0) {
            photo = photo.maxScans(scans);
        }
        if (segments > 0) {
            photo = photo.maxSegments(segments);
        }
        if (seconds > 0) {
            photo = photo.cancellation(Cancellation.after(Duration.ofSeconds(seconds)));
        }
        try {
            return work.run(photo);
        } catch (CancellationException error) {
            throw new IOException("takes longer than " + seconds + " s; raise --timeout", error);
        }
    }
}
