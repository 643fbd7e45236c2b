package com.pelorin.photos.quenby.autoenhance;

import android.graphics.RectF;
import java.io.IOException;
import java.nio.file.AccessDeniedException;
import java.nio.file.Files;
import java.nio.file.NoSuchFileException;
import java.nio.file.Path;
import java.nio.file.StandardCopyOption;
import java.util.List;
import java.util.UUID;

/**
 * Filters a JPEG file into another: rotates without loss, decodes, filters, encodes at quality 90.
 * The output appears whole or not at all, whatever fails; it may be the input. Immutable: each
 * setting gives a new job, and any thread may run it.
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

    private JpegJob(Path input, Path output, int rotation, int scale, List<RectF> faces,
            Filter filter, String params) {
        this.input = input;
        this.output = output;
        this.rotation = rotation;
        this.scale = scale;
        this.faces = faces;
        this.filter = filter;
        this.params = params;
    }

    /**
     * Begins with automatic enhancement at slider 0.4, full size, no rotation and no faces.
     *
     * @param input  the file to read
     * @param output the file to write
     * @return the job
     */
    public static JpegJob of(Path input, Path output) {
        return new JpegJob(input, output, 0, 1, List.of(), Filter.AUTO, "slider=0.4;");
    }

    /**
     * Turns the photo first, without loss but for blocks at the edge that cannot be moved.
     *
     * @param degrees clockwise, a multiple of 90
     * @return a job that does
     * @throws IllegalArgumentException for another angle
     */
    public JpegJob rotation(int degrees) {
        if (degrees % 90 != 0) {
            throw new IllegalArgumentException("no multiple of 90 degrees: " + degrees);
        }
        return new JpegJob(input, output, degrees % 360, scale, faces, filter, params);
    }

    /**
     * Makes the picture smaller.
     *
     * @param divisor 1, 2, 4 or 8
     * @return a job that does
     * @throws IllegalArgumentException for another divisor
     */
    public JpegJob scale(int divisor) {
        if (!List.of(1, 2, 4, 8).contains(divisor)) {
            throw new IllegalArgumentException("neither 1, 2, 4 nor 8: " + divisor);
        }
        return new JpegJob(input, output, rotation, divisor, faces, filter, params);
    }

    /**
     * Takes care of faces.
     *
     * @param faces in fractions of the turned photo
     * @return a job that does
     * @throws IllegalArgumentException when a face is null or not finite
     */
    public JpegJob faces(List<RectF> faces) {
        Faces.check(faces);
        return new JpegJob(input, output, rotation, scale, List.copyOf(faces), filter, params);
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
        return new JpegJob(input, output, rotation, scale, faces, filter, params);
    }

    /**
     * Does it.
     *
     * @throws NoSuchFileException      when there is no input file
     * @throws JpegException            when the input is no JPEG file or damaged
     * @throws IOException              when a file cannot be read or written
     * @throws IllegalArgumentException when a required parameter is missing or unreadable
     * @throws OutOfMemoryError         when memory does not suffice
     */
    public void run() throws IOException {
        if (!Files.exists(input)) {
            throw new NoSuchFileException(input.toString());
        }
        if (!Files.isReadable(input) || Files.isDirectory(input)) {
            throw new AccessDeniedException(input.toString(), null, "not a readable file");
        }
        if (rotation == 0) {
            callNative(output);
            return;
        }
        // The native leaves a rotated copy at its output when it fails later.
        Path beside = output.resolveSibling("." + output.getFileName() + "." + UUID.randomUUID());
        try {
            callNative(beside);
            Files.move(beside, output, StandardCopyOption.ATOMIC_MOVE,
                    StandardCopyOption.REPLACE_EXISTING);
        } finally {
            Files.deleteIfExists(beside);
        }
    }

    private void callNative(Path target) throws IOException {
        NativeLibrary.load();
        boolean written;
        try {
            written = new QuenbyEngine().applyAutoEnhanceFilterToJpegFile(input.toString(),
                    target.toString(), rotation, Faces.check(faces), scale, filter.key(), params);
        } catch (IllegalArgumentException error) {
            throw error;
        } catch (RuntimeException error) {
            throw new JpegException(input + ": " + error.getMessage(), error);
        }
        if (!written) {
            throw new JpegException(input + " cannot be read as a JPEG file", null);
        }
    }
}
