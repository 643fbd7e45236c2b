package com.pelorin.photos.quenby.desktop;

import java.io.IOException;
import java.nio.file.FileAlreadyExistsException;
import java.nio.file.Files;
import java.nio.file.LinkOption;
import java.nio.file.Path;
import java.nio.file.StandardCopyOption;
import java.nio.file.attribute.PosixFilePermission;
import java.nio.file.attribute.PosixFilePermissions;
import java.security.MessageDigest;
import java.security.NoSuchAlgorithmException;
import java.util.Arrays;
import java.util.Map;
import java.util.Set;

/**
 * Libraries in a folder that is named by their content and that nobody but the user can have
 * written to. Any number of processes may unpack the same ones at once: a file appears whole.
 */
final class UnpackedLibraries {
    private static final Set<PosixFilePermission> OWNER_ONLY =
            PosixFilePermissions.fromString("rwx------");

    private UnpackedLibraries() {}

    /** The folder's name: the user's, and the first 64 bits of a hash of names and contents. */
    static String folderName(Map<String, byte[]> libraries) {
        try {
            MessageDigest digest = MessageDigest.getInstance("SHA-256");
            libraries.forEach((name, content) -> {
                digest.update((name + " " + content.length + "\n").getBytes());
                digest.update(content);
            });
            StringBuilder text = new StringBuilder("quenby-");
            text.append(System.getProperty("user.name")).append('-');
            for (byte part : Arrays.copyOf(digest.digest(), 8)) {
                text.append(String.format("%02x", part));
            }
            return text.toString();
        } catch (NoSuchAlgorithmException error) {
            throw new IllegalStateException("every Java platform has SHA-256", error);
        }
    }

    /**
     * Sees to it that the folder exists and holds the libraries as they are.
     *
     * @throws IOException when it cannot be written, or is not the user's alone
     */
    static void into(Path folder, Map<String, byte[]> libraries) throws IOException {
        try {
            Files.createDirectory(folder, PosixFilePermissions.asFileAttribute(OWNER_ONLY));
        } catch (FileAlreadyExistsException byThisOrAnotherProcess) {
            if (!Files.isDirectory(folder, LinkOption.NOFOLLOW_LINKS)) {
                throw new IOException("not a folder", byThisOrAnotherProcess);
            }
        }
        requireOwn(folder);
        for (Map.Entry<String, byte[]> library : libraries.entrySet()) {
            Path file = folder.resolve(library.getKey());
            if (!holds(file, library.getValue())) {
                replace(file, library.getValue());
            }
        }
    }

    private static void requireOwn(Path folder) throws IOException {
        Path probe = Files.createTempFile(folder, "owner", null);
        try {
            if (!Files.getOwner(folder).equals(Files.getOwner(probe))
                    || !Files.getPosixFilePermissions(folder).equals(OWNER_ONLY)) {
                throw new IOException("somebody else's folder");
            }
        } finally {
            Files.delete(probe);
        }
    }

    private static boolean holds(Path file, byte[] content) throws IOException {
        return Files.exists(file) && Files.size(file) == content.length
                && Arrays.equals(Files.readAllBytes(file), content);
    }

    private static void replace(Path file, byte[] content) throws IOException {
        Path part = Files.createTempFile(file.getParent(), file.getFileName() + "", ".part");
        try {
            Files.write(part, content);
            Files.move(part, file, StandardCopyOption.ATOMIC_MOVE);
        } finally {
            Files.deleteIfExists(part);
        }
    }
}
