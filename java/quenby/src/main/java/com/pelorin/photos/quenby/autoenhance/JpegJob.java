package com.pelorin.photos.quenby.autoenhance;

import android.graphics.RectF;
import java.io.IOException;
import java.nio.file.AccessDeniedException;
import java.nio.file.Files;
import java.nio.file.NoSuchFileException;
import java.nio.file.Path;
import java.util.List;

/**
 * Filters a photo's file into a JPEG file, as the {@code quenby} command does: upright, turned,
 * filtered, encoded at quality 90, with the metadata kept as far as it still holds. The output
 * appears whole or not at all, whatever fails, and it may be the input; a file that is replaced
 * keeps its permissions. Immutable: each setting gives a new job, and any thread may run it.
 *
 * <pre>{@code
 * JpegJob.of(input, output).rotation(90).filter(Filter.AUTO, "slider=0.4;").run();
 * }</pre>
 */
public final class JpegJob {
    private final Path input;
    private final Path output;
    private final Filter filter;
    private final String params;
    private final PhotoBytes settings; // of a file that is not read yet

    private JpegJob(Path input, Path output, Filter filter, String params, PhotoBytes settings) {
        this.input = input;
        this.output = output;
        this.filter = filter;
        this.params = params;
        this.settings = settings;
    }

    private JpegJob with(PhotoBytes changed) {
        return new JpegJob(input, output, filter, params, changed);
    }

    /**
     * Begins with automatic enhancement at slider 0.4, full size, no rotation and the faces that the
     * file knows of.
     *
     * @param input  the file to read
     * @param output the file to write
     * @return the job
     */
    public static JpegJob of(Path input, Path output) {
        return new JpegJob(
                input, output, Filter.AUTO, "slider=0.4;", PhotoBytes.of(new byte[0]));
    }

    /**
     * Turns the photo first, beyond upright.
     *
     * @param degrees clockwise, a multiple of 90
     * @return a job that does
     * @throws IllegalArgumentException for another angle
     */
    public JpegJob rotation(int degrees) {
        return with(settings.rotation(degrees));
    }

    /**
     * Makes the picture smaller.
     *
     * @param divisor 1, 2, 4 or 8
     * @return a job that does
     * @throws IllegalArgumentException for another divisor
     */
    public JpegJob scale(int divisor) {
        return with(settings.scale(divisor));
    }

    /**
     * Takes care of faces, beside those that the file knows of: those that its XMP metadata names.
     *
     * @param faces in fractions of the upright and turned photo
     * @return a job that does
     * @throws IllegalArgumentException when a face is null or not finite
     */
    public JpegJob faces(List<RectF> faces) {
        return with(settings.faces(faces));
    }

    /**
     * Refuses larger files, as too large, before they are read.
     *
     * @param bytes at least 1; 1073741824 unless given
     * @return a job that does
     * @throws IllegalArgumentException for less
     */
    public JpegJob maxBytes(long bytes) {
        return with(settings.maxBytes(bytes));
    }

    /**
     * Refuses larger pictures, as too large; see {@link PhotoBytes#maxPixels}.
     *
     * @param pixels at least 1, of the picture as stored
     * @return a job that does
     * @throws IllegalArgumentException for less
     */
    public JpegJob maxPixels(long pixels) {
        return with(settings.maxPixels(pixels));
    }

    /**
     * Refuses JPEG files of more scans, as too large.
     *
     * @param scans at least 1; 100 unless given
     * @return a job that does
     * @throws IllegalArgumentException for less
     */
    public JpegJob maxScans(int scans) {
        return with(settings.maxScans(scans));
    }

    /**
     * Refuses JPEG files of more segments before the picture data, as too large.
     *
     * @param segments at least 1; 4096 unless given
     * @return a job that does
     * @throws IllegalArgumentException for less
     */
    public JpegJob maxSegments(int segments) {
        return with(settings.maxSegments(segments));
    }

    /**
     * Chooses the filter.
     *
     * @param filter which
     * @param params its parameters, "key=value;" items, every one with its semicolon
     * @return a job that does
     */
    public JpegJob filter(Filter filter, String params) {
        if (filter == null) {
            throw new UnknownFilterException(null);
        }
        return new JpegJob(input, output, filter, params, settings);
    }

    /**
     * Lets another thread, or the time, give the job up.
     *
     * @param cancellation by which it does, such as {@link Cancellation#after}; null for nobody
     * @return a job that can be given up
     */
    public JpegJob cancellation(Cancellation cancellation) {
        return with(settings.cancellation(cancellation));
    }

    /**
     * Does it.
     *
     * @throws NoSuchFileException      when there is no input file
     * @throws JpegException            when the input is empty, no photo, truncated, damaged or
     *                                  beyond a limit; the kind says which, the message why
     * @throws IOException              when a file cannot be read or written
     * @throws IllegalArgumentException when a parameter is unknown, missing or unreadable; the
     *                                  message says what the filter wants
     * @throws java.util.concurrent.CancellationException when it was given up
     * @throws OutOfMemoryError         when memory does not suffice
     */
    public void run() throws IOException {
        if (Files.isDirectory(input)) {
            throw new AccessDeniedException(input.toString(), null, "a folder");
        }
        byte[] made;
        try {
            if (settings.isTooLarge(Files.size(input))) {
                throw new PhotoException(PhotoException.Kind.TOO_LARGE,
                        "is larger than the most that is read of a file", null);
            }
            made = settings.inFile(Files.readAllBytes(input)).filter(filter, params);
        } catch (PhotoException error) {
            throw new JpegException(input.toString(), error);
        }
        FileReplacement.write(output, made);
    }
}
