package com.pelorin.photos.quenby.desktop;

import java.io.IOException;
import java.io.InputStream;
import java.nio.file.FileAlreadyExistsException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.nio.file.StandardCopyOption;
import java.util.ArrayList;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;

/**
 * Loads libpn_quenby.so and libquenby_photo.so with the libraries beside them. They are looked for
 * in the folder or file that the property {@value #PROPERTY} names, and only there if it is set; then on
 * {@code java.library.path}; then in this jar, from which they are copied into a folder of the
 * user's own below {@code java.io.tmpdir} or, where that cannot be written or may not hold
 * programs, {@code ~/.cache}. The folder is named by their content, and any number of processes may
 * make it at once.
 */
public final class NativeLibraries {
    /** The property that names the folder or the file of libpn_quenby.so. */
    public static final String PROPERTY = "quenby.library";

    private static final NativeLibraries ENGINE = new NativeLibraries("pn_quenby");
    private static final NativeLibraries PHOTO = new NativeLibraries("quenby_photo");
    /** What the jar holds for one kind of machine; each comes after those it needs. */
    private static final List<String> NAMES = List.of("libpn.so", "libpnjni.so",
            "libpn_imgproc.so", "libjnigraphics.so", ENGINE.file, PHOTO.file);

    private final String name;
    private final String file;
    private boolean loaded;

    private NativeLibraries(String name) {
        this.name = name;
        this.file = "lib" + name + ".so";
    }

    /**
     * Loads libpn_quenby.so for this class's class loader, once. Several class loaders may each
     * load it.
     *
     * @throws UnsatisfiedLinkError when that fails; its message lists what was tried and names the
     *                              properties to set
     */
    public static void load() {
        ENGINE.loadOnce();
    }

    /**
     * Loads libquenby_photo.so in the same way.
     *
     * @throws UnsatisfiedLinkError when that fails; its message lists what was tried and names the
     *                              properties to set
     */
    public static void loadPhoto() {
        PHOTO.loadOnce();
    }

    private synchronized void loadOnce() {
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
                    + String.join("\n  ", tried) + "\nSet the property " + PROPERTY
                    + " to the folder that holds " + file
                    + ", or java.io.tmpdir to one that can be written and may hold programs.");
        }
        loaded = true;
    }

    private boolean loadFromProperty(Path path, List<String> tried) {
        Path named = Files.isDirectory(path) ? path.resolve(file)
                : this == ENGINE ? path : path.resolveSibling(file);
        return loadFile(named, "property " + PROPERTY + ", ", tried);
    }

    private boolean loadFromLibraryPath(List<String> tried) {
        try {
            System.loadLibrary(name);
            return true;
        } catch (UnsatisfiedLinkError error) {
            tried.add("java.library.path " + System.getProperty("java.library.path") + ": "
                    + error.getMessage());
            return false;
        }
    }

    private boolean loadFromJar(List<String> tried) {
        String folder = "/native/linux-" + System.getProperty("os.arch") + "/";
        Map<String, byte[]> libraries = new LinkedHashMap<>();
        try {
            for (String each : NAMES) {
                try (InputStream in = NativeLibraries.class.getResourceAsStream(folder + each)) {
                    if (in != null) {
                        libraries.put(each, in.readAllBytes());
                    }
                }
            }
        } catch (IOException error) {
            tried.add("this jar: " + error);
            return false;
        }
        if (!libraries.containsKey(file)) {
            tried.add("this jar: no " + folder + file);
            return false;
        }
        for (Path parent : parents()) {
            Path target = parent.resolve(UnpackedLibraries.folderName(libraries));
            try {
                UnpackedLibraries.into(target, libraries);
            } catch (IOException | UnsupportedOperationException error) {
                tried.add("this jar, copied into " + target + ": " + error);
                continue;
            }
            if (loadFile(target.resolve(file), "this jar, copied into ", tried)) {
                return true;
            }
        }
        return false;
    }

    /** Where copies may go, the better place first. */
    private static List<Path> parents() {
        Path cache = Path.of(System.getProperty("user.home"), ".cache");
        try {
            Files.createDirectory(cache);
        } catch (FileAlreadyExistsException itDoes) {
            // As in most homes.
        } catch (IOException error) {
            // Whoever tries to write there will report it.
        }
        return List.of(Path.of(System.getProperty("java.io.tmpdir")), cache);
    }

    private static boolean loadFile(Path file, String what, List<String> tried) {
        Path absolute = file.toAbsolutePath();
        // The class loader that has the file may go meanwhile, with the libraries that a copy needs.
        for (int attempt = 0; attempt < 3; ++attempt) {
            try {
                System.load(absolute.toString());
                return true;
            } catch (UnsatisfiedLinkError error) {
                if (error.getMessage() == null
                        || !error.getMessage().contains("already loaded in another classloader")) {
                    tried.add(what + absolute + ": " + error.getMessage());
                    return false;
                }
            }
            if (loadPrivateCopy(absolute, what, tried)) {
                return true;
            }
        }
        return false;
    }

    /** A virtual machine loads a file for one class loader only. */
    private static boolean loadPrivateCopy(Path file, String what, List<String> tried) {
        for (Path parent : parents()) {
            Path copy = null;
            try {
                copy = Files.createTempFile(parent, "quenby", ".so");
                Files.copy(file, copy, StandardCopyOption.REPLACE_EXISTING);
                System.load(copy.toString());
                return true;
            } catch (IOException | UnsatisfiedLinkError error) {
                tried.add(what + file + ", copied into " + parent
                        + " for another class loader: " + error);
            } finally {
                deleteQuietly(copy);
            }
        }
        return false;
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
