package com.pelorin.photos.quenby.autoenhance;

import java.io.IOException;
import java.nio.ByteBuffer;
import java.nio.channels.FileChannel;
import java.nio.file.AccessDeniedException;
import java.nio.file.FileSystemLoopException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.nio.file.StandardCopyOption;
import java.nio.file.StandardOpenOption;
import java.nio.file.attribute.FileAttribute;
import java.nio.file.attribute.PosixFileAttributeView;
import java.nio.file.attribute.PosixFileAttributes;
import java.nio.file.attribute.PosixFilePermission;
import java.nio.file.attribute.PosixFilePermissions;
import java.util.EnumSet;
import java.util.Set;
import java.util.UUID;

/** Writes files that appear whole or not at all. */
final class FileReplacement {
    private static final Set<StandardOpenOption> NEW =
            EnumSet.of(StandardOpenOption.CREATE_NEW, StandardOpenOption.WRITE);
    private static final FileAttribute<?> PRIVATE =
            PosixFilePermissions.asFileAttribute(PosixFilePermissions.fromString("rw-------"));
    private static final int MOST_LINKS = 40;

    private FileReplacement() {}

    /**
     * Writes a file beside another and, once its bytes are on the disk, has it take that one's
     * place. A file that is replaced keeps its permissions, and its owner as far as we may; a
     * symbolic link stays, and what it names is replaced. Pipes and devices are written directly.
     */
    static void write(Path file, byte[] content) throws IOException {
        boolean exists = Files.exists(file);
        if (exists && !Files.isRegularFile(file)) {
            Files.write(file, content);
            return;
        }
        // A rename needs only the folder; a protected file stays protected all the same.
        if (exists && !Files.isWritable(file)) {
            throw new AccessDeniedException(file.toString());
        }
        Path target = linkTarget(file);
        // The command sweeps temporaries of its own away, whose names are numbers.
        Path beside = target.resolveSibling(".quenby-java-" + UUID.randomUUID() + ".tmp");
        PosixFileAttributeView old = exists
                ? Files.getFileAttributeView(target, PosixFileAttributeView.class) : null;
        try {
            Set<PosixFilePermission> usual = old == null ? usualPermissions(beside) : null;
            try (FileChannel channel = FileChannel.open(beside, NEW, PRIVATE)) {
                for (ByteBuffer rest = ByteBuffer.wrap(content); rest.hasRemaining();) {
                    channel.write(rest);
                }
                // Nobody else has it before it is whole.
                if (old != null) {
                    takeAfter(old.readAttributes(), beside);
                } else {
                    Files.setPosixFilePermissions(beside, usual);
                }
                channel.force(true);
            }
            Files.move(beside, target, StandardCopyOption.ATOMIC_MOVE);
        } finally {
            Files.deleteIfExists(beside);
        }
        sync(target.toAbsolutePath().getParent());
    }

    /** Of a new file with this name, as the process's mask or the folder's own rules have it. */
    private static Set<PosixFilePermission> usualPermissions(Path name) throws IOException {
        FileChannel.open(name, NEW).close();
        try {
            return Files.getPosixFilePermissions(name);
        } finally {
            Files.delete(name);
        }
    }

    /** A name that is not on the disk yet means the old file after a power cut, which is whole. */
    private static void sync(Path folder) {
        try (FileChannel channel = FileChannel.open(folder, StandardOpenOption.READ)) {
            channel.force(true);
        } catch (IOException cannotBeSynced) {
            // The file is there all the same.
        }
    }

    /** The file that a path names after following links, which need not exist. */
    private static Path linkTarget(Path file) throws IOException {
        Path path = file;
        for (int links = 0; Files.isSymbolicLink(path); ++links) {
            if (links == MOST_LINKS) {
                throw new FileSystemLoopException(file.toString());
            }
            path = path.resolveSibling(Files.readSymbolicLink(path));
        }
        return path;
    }

    private static void takeAfter(PosixFileAttributes old, Path file) throws IOException {
        PosixFileAttributeView made =
                Files.getFileAttributeView(file, PosixFileAttributeView.class);
        try {
            made.setGroup(old.group());
            made.setOwner(old.owner());
        } catch (IOException notOurs) {
            // The permissions matter more.
        }
        made.setPermissions(old.permissions());
    }
}
