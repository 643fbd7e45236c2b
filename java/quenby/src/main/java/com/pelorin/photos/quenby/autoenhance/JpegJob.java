package com.pelorin.photos.quenby.autoenhance;

import android.graphics.RectF;
import java.io.IOException;
import java.nio.file.AccessDeniedException;
import java.nio.file.Files;
import java.nio.file.NoSuchFileException;
import java.nio.file.Path;
import java.util.Arrays;
import java.util.Collections;
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
    private final int rotation;
    private final int scale;
    private final List<RectF> faces;
    private final Filter filter;
    private final String params;
    private final Cancellation cancellation;

    private JpegJob(Path input, Path output, int rotation, int scale, List<RectF> faces,
            Filter filter, String params, Cancellation cancellation) {
        this.input = input;
        this.output = output;
        this.rotation = rotation;
        this.scale = scale;
        this.faces = faces;
        this.filter = filter;
        this.params = params;
        this.cancellation = cancellation;
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
        return new JpegJob(input, output, 0, 1, Collections.emptyList(), Filter.AUTO,
                "slider=0.4;", null);
    }

    /**
     * Turns the photo first, beyond upright.
     *
     * @param degrees clockwise, a multiple of 90
     * @return a job that does
     * @throws IllegalArgumentException for another angle
     */
    public JpegJob rotation(int degrees) {
        if (degrees % 90 != 0) {
            throw new IllegalArgumentException("no multiple of 90 degrees: " + degrees);
        }
        return new JpegJob(
                input, output, degrees % 360, scale, faces, filter, params, cancellation);
    }

    /**
     * Makes the picture smaller.
     *
     * @param divisor 1, 2, 4 or 8
     * @return a job that does
     * @throws IllegalArgumentException for another divisor
     */
    public JpegJob scale(int divisor) {
        if (!Arrays.asList(1, 2, 4, 8).contains(divisor)) {
            throw new IllegalArgumentException("neither 1, 2, 4 nor 8: " + divisor);
        }
        return new JpegJob(input, output, rotation, divisor, faces, filter, params, cancellation);
    }

    /**
     * Takes care of faces, beside those that the file knows of: those that its XMP metadata names.
     *
     * @param faces in fractions of the upright and turned photo
     * @return a job that does
     * @throws IllegalArgumentException when a face is null or not finite
     */
    public JpegJob faces(List<RectF> faces) {
        List<RectF> own = Arrays.asList(Faces.check(faces));
        return new JpegJob(input, output, rotation, scale, own, filter, params, cancellation);
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
        return new JpegJob(input, output, rotation, scale, faces, filter, params, cancellation);
    }

    /**
     * Lets another thread give the job up.
     *
     * @param cancellation by which it does; null for nobody
     * @return a job that can be given up
     */
    public JpegJob cancellation(Cancellation cancellation) {
        return new JpegJob(input, output, rotation, scale, faces, filter, params, cancellation);
    }

    /**
     * Does it.
     *
     * @throws NoSuchFileException      when there is no input file
     * @throws JpegException            when the input is empty, no photo, truncated or damaged; the
     *                                  kind says which, the message why
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
            made = PhotoBytes.of(Files.readAllBytes(input)).rotation(rotation).scale(scale)
                    .faces(faces).cancellation(cancellation).filter(filter, params);
        } catch (PhotoException error) {
            throw new JpegException(input.toString(), error);
        }
        FileReplacement.write(output, made);
    }
}
