package com.pelorin.photos.quenby.desktop;

import java.io.IOException;
import java.io.InputStream;
import java.nio.file.Files;
import java.nio.file.LinkOption;
import java.nio.file.Path;
import java.nio.file.StandardCopyOption;
import java.nio.file.attribute.PosixFilePermission;
import java.nio.file.attribute.PosixFilePermissions;
import java.security.MessageDigest;
import java.security.NoSuchAlgorithmException;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;
import java.util.Set;

/**
 * Loads libpn_quenby.so with the libraries beside it. They are looked for in the folder or file
 * that the property {@value #PROPERTY} names, and only there if it is set; then on
 * {@code java.library.path}; then in this jar, from which they are copied into a folder of the
 * user's own below {@code java.io.tmpdir} or {@code ~/.cache}, named by their content.
 */
public final class NativeLibraries {
    /** The property that names the folder or the file of libpn_quenby.so. */
    public static final String PROPERTY = "quenby.library";

    private static final String LIBRARY = "libpn_quenby.so";
    private static final List<String> BESIDE =
            List.of("libpn.so", "libpnjni.so", "libpn_imgproc.so", "libjnigraphics.so");
    private static final Set<PosixFilePermission> OWNER_ONLY =
            PosixFilePermissions.fromString("rwx------");

    private static boolean loaded;

    private NativeLibraries() {}

    /**
     * Loads the libraries for this class's class loader, once. Several class loaders may each load
     * them.
     *
     * @throws UnsatisfiedLinkError when that fails; its message lists what was tried
     */
    public static synchronized void load() {
        if (loaded) {
            return;
        }
        List<String> tried = new ArrayList<>();
        String explicit = System.getProperty(PROPERTY);
        boolean found = explicit != null
                ? loadFromProperty(Path.of(explicit), tried)
                : loadFromLibraryPath(tried) || loadFromJar(tried);
        if (!found) {
            throw new UnsatisfiedLinkError("Quenby's native library cannot be loaded. Tried:\n  "
                    + String.join("\n  ", tried));
        }
        loaded = true;
    }

    private static boolean loadFromProperty(Path path, List<String> tried) {
        Path file = Files.isDirectory(path) ? path.resolve(LIBRARY) : path;
        return loadFile(file, "property " + PROPERTY + ", ", tried);
    }

    private static boolean loadFromLibraryPath(List<String> tried) {
        try {
            System.loadLibrary("pn_quenby");
            return true;
        } catch (UnsatisfiedLinkError error) {
            tried.add("java.library.path " + System.getProperty("java.library.path") + ": "
                    + error.getMessage());
            return false;
        }
    }

    private static boolean loadFromJar(List<String> tried) {
        String folder = "linux-" + System.getProperty("os.arch");
        Map<String, byte[]> libraries = new LinkedHashMap<>();
        try {
            for (String name : names()) {
                try (InputStream in =
                        NativeLibraries.class.getResourceAsStream(folder + "/" + name)) {
                    if (in == null) {
                        tried.add("this jar: no " + folder + "/" + name);
                        return false;
                    }
                    libraries.put(name, in.readAllBytes());
                }
            }
        } catch (IOException error) {
            tried.add("this jar: " + error);
            return false;
        }
        String name = "quenby-" + System.getProperty("user.name") + "-" + contentHash(libraries);
        for (Path parent : List.of(Path.of(System.getProperty("java.io.tmpdir")),
                Path.of(System.getProperty("user.home"), ".cache"))) {
            Path target = parent.resolve(name);
            try {
                extract(libraries, target);
            } catch (IOException | UnsupportedOperationException error) {
                tried.add("this jar, copied into " + target + ": " + error);
                continue;
            }
            if (loadFile(target.resolve(LIBRARY), "this jar, copied into ", tried)) {
                return true;
            }
        }
        return false;
    }

    private static List<String> names() {
        List<String> names = new ArrayList<>(BESIDE);
        names.add(LIBRARY);
        return names;
    }

    private static String contentHash(Map<String, byte[]> libraries) {
        try {
            MessageDigest digest = MessageDigest.getInstance("SHA-256");
            libraries.values().forEach(digest::update);
            StringBuilder text = new StringBuilder();
            for (byte part : Arrays.copyOf(digest.digest(), 8)) {
                text.append(String.format("%02x", part));
            }
            return text.toString();
        } catch (NoSuchAlgorithmException error) {
            throw new IllegalStateException("every Java platform has SHA-256", error);
        }
    }

    /** Puts the libraries into a folder that nobody but the user can have written to. */
    private static void extract(Map<String, byte[]> libraries, Path folder) throws IOException {
        if (!Files.isDirectory(folder, LinkOption.NOFOLLOW_LINKS)) {
            Files.createDirectory(folder, PosixFilePermissions.asFileAttribute(OWNER_ONLY));
        }
        Path probe = Files.createTempFile(folder, "owner", null);
        try {
            if (!Files.getOwner(folder).equals(Files.getOwner(probe))
                    || !Files.getPosixFilePermissions(folder).equals(OWNER_ONLY)) {
                throw new IOException("somebody else's folder");
            }
        } finally {
            Files.delete(probe);
        }
        for (Map.Entry<String, byte[]> library : libraries.entrySet()) {
            Path file = folder.resolve(library.getKey());
            if (Files.exists(file) && Arrays.equals(Files.readAllBytes(file), library.getValue())) {
                continue;
            }
            Path part = Files.createTempFile(folder, library.getKey(), ".part");
            Files.write(part, library.getValue());
            Files.move(part, file, StandardCopyOption.ATOMIC_MOVE);
        }
    }

    private static boolean loadFile(Path file, String what, List<String> tried) {
        Path absolute = file.toAbsolutePath();
        try {
            System.load(absolute.toString());
            return true;
        } catch (UnsatisfiedLinkError error) {
            if (error.getMessage() != null
                    && error.getMessage().contains("already loaded in another classloader")) {
                return loadPrivateCopy(absolute, what, tried);
            }
            tried.add(what + absolute + ": " + error.getMessage());
            return false;
        }
    }

    /** A virtual machine loads a file for one class loader only. */
    private static boolean loadPrivateCopy(Path file, String what, List<String> tried) {
        Path copy = null;
        try {
            copy = Files.createTempFile("quenby", ".so");
            Files.copy(file, copy, StandardCopyOption.REPLACE_EXISTING);
            System.load(copy.toString());
            return true;
        } catch (IOException | UnsatisfiedLinkError error) {
            tried.add(what + file + ", copied for another class loader: " + error);
            return false;
        } finally {
            deleteQuietly(copy);
        }
    }

    private static void deleteQuietly(Path file) {
        try {
            if (file != null) {
                Files.deleteIfExists(file);
            }
        } catch (IOException error) {
            // A copy is left in the temporary folder, which is what such folders are for.
        }
    }
}
