package com.pelorin.photos.quenby.spark;

import java.io.EOFException;
import java.io.FileNotFoundException;
import java.io.IOException;
import java.io.InputStream;
import java.io.OutputStream;
import java.nio.file.Files;
import java.util.Arrays;
import java.util.Set;
import java.util.UUID;
import org.apache.hadoop.conf.Configuration;
import org.apache.hadoop.fs.ChecksumFileSystem;
import org.apache.hadoop.fs.FSDataInputStream;
import org.apache.hadoop.fs.FileSystem;
import org.apache.hadoop.fs.Path;
import org.apache.hadoop.fs.RawLocalFileSystem;

/**
 * A file that appears whole and once, however many attempts write it: each writes a file of its own
 * in a folder of the run and renames it. Where a file appears when it is closed, and renaming is
 * copying, it is written in place.
 */
final class ResultFile {
    private static final Set<String> OBJECT_STORES =
            Set.of("s3", "s3a", "s3n", "gs", "oss", "cosn", "obs");
    private static final int LONGEST_ARRAY = Integer.MAX_VALUE - 8;

    private ResultFile() {}

    /**
     * Reads a file.
     *
     * @param most bytes that it may have
     * @throws IOException when it has more or cannot be read
     */
    static byte[] read(Path path, long most, Configuration hadoop) throws IOException {
        FileSystem files = plain(path.getFileSystem(hadoop));
        long length = files.getFileStatus(path).getLen();
        if (length > most) {
            throw new IOException("is larger than " + most
                    + " bytes, the most that is read of a file");
        }
        if (length > LONGEST_ARRAY) {
            throw new IOException("has " + length + " bytes, more than an array holds");
        }
        byte[] content = new byte[(int) length];
        try (FSDataInputStream in = files.open(path)) {
            in.readFully(content);
        } catch (EOFException error) {
            throw new IOException("became shorter while it was read", error);
        }
        return content;
    }

    /**
     * Writes a file unless it is there already, byte for byte.
     *
     * @param parts     the folder of unfinished files
     * @param overwrite whether another file may be replaced
     * @throws IOException when another file is there or the file cannot be written
     */
    static void write(Path target, byte[] content, Path parts, boolean overwrite,
            Configuration hadoop) throws IOException {
        FileSystem files = plain(target.getFileSystem(hadoop));
        if (files.exists(target)) {
            if (isThere(files, target, content)) {
                return;
            }
            if (!overwrite) {
                throw new IOException(
                        "the output is there and is another file; --overwrite replaces it");
            }
        }
        if (OBJECT_STORES.contains(files.getUri().getScheme())) {
            put(files, target, content);
            return;
        }
        Path part = new Path(parts, UUID.randomUUID().toString());
        try {
            put(files, part, content);
            files.mkdirs(target.getParent());
            // Another attempt may have been faster, and a file system refuses or replaces.
            if (isThere(files, target, content)) {
                return;
            }
            if (overwrite) {
                files.delete(target, false);
            }
            if (!files.rename(part, target) && !isThere(files, target, content)) {
                throw new IOException("cannot be renamed to " + target);
            }
        } finally {
            files.delete(part, false);
        }
    }

    private static void put(FileSystem files, Path path, byte[] content) throws IOException {
        if (files instanceof RawLocalFileSystem) { // whose create runs chmod for each file
            java.nio.file.Path local = ((RawLocalFileSystem) files).pathToFile(path).toPath();
            Files.createDirectories(local.getParent());
            Files.write(local, content);
            return;
        }
        try (OutputStream out = files.create(path, true)) {
            out.write(content);
        }
    }

    private static boolean isThere(FileSystem files, Path target, byte[] content)
            throws IOException {
        if (!files.exists(target)) {
            return false;
        }
        try (InputStream in = files.open(target)) {
            return Arrays.equals(in.readNBytes(content.length), content) && in.read() < 0;
        } catch (FileNotFoundException gone) { // another attempt is replacing it
            return false;
        }
    }

    /** Local files without a file of checksums beside each. */
    private static FileSystem plain(FileSystem files) {
        return files instanceof ChecksumFileSystem
                ? ((ChecksumFileSystem) files).getRawFileSystem() : files;
    }
}
