package com.pelorin.photos.quenby.spark;

import java.io.FileNotFoundException;
import java.io.IOException;
import java.io.InputStream;
import java.io.OutputStream;
import java.util.Arrays;
import java.util.Set;
import java.util.UUID;
import org.apache.hadoop.conf.Configuration;
import org.apache.hadoop.fs.ChecksumFileSystem;
import org.apache.hadoop.fs.FileStatus;
import org.apache.hadoop.fs.FileSystem;
import org.apache.hadoop.fs.Path;

/**
 * A file that appears whole and once, however many attempts write it: each writes a file of its own
 * in a folder of the run and renames it. Where a file appears when it is closed, and renaming is
 * copying, it is written in place.
 */
final class ResultFile {
    private static final Set<String> OBJECT_STORES =
            Set.of("s3", "s3a", "s3n", "gs", "oss", "cosn", "obs");

    private ResultFile() {}

    static byte[] read(Path path, Configuration hadoop) throws IOException {
        FileSystem files = path.getFileSystem(hadoop);
        FileStatus status = files.getFileStatus(path);
        if (status.getLen() > Integer.MAX_VALUE - 8) {
            throw new IOException("has " + status.getLen() + " bytes, more than an array holds");
        }
        try (InputStream in = files.open(path)) {
            return in.readNBytes((int) status.getLen());
        }
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
            put(files, target, content, true);
            return;
        }
        Path part = new Path(parts, UUID.randomUUID().toString());
        try {
            put(files, part, content, false);
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

    private static void put(FileSystem files, Path path, byte[] content, boolean overwrite)
            throws IOException {
        try (OutputStream out = files.create(path, overwrite)) {
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
