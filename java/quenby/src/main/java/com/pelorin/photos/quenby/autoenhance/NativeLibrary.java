package com.pelorin.photos.quenby.autoenhance;

import java.lang.reflect.InvocationTargetException;

/**
 * The libraries behind the natives: libpn_quenby.so of {@link QuenbyEngine} and
 * {@link ImageDupeDetector}, libquenby_photo.so of {@link PhotoBytes}.
 */
public final class NativeLibrary {
    private static final String DESKTOP = "com.pelorin.photos.quenby.desktop.NativeLibraries";

    private static volatile boolean loaded;
    private static volatile boolean photoLoaded;

    private NativeLibrary() {}

    /**
     * Loads libpn_quenby.so unless that has been done: on a device as the application's, elsewhere
     * as {@code quenby-desktop} does. Any thread may call, several at once too; what failed is
     * tried anew at the next call. Nothing here or in the classes that loading initialises waits for a
     * class to be initialised, so no order of first uses can block.
     *
     * @throws UnsatisfiedLinkError when it cannot be loaded; the message says why
     */
    public static void load() {
        if (!loaded) {
            load("load", "pn_quenby");
            loaded = true;
        }
    }

    /**
     * Tells which engine is at work, for records of what it made. Loads libquenby_photo.so.
     *
     * @return the version, such as "0.1.0"
     * @throws UnsatisfiedLinkError when it cannot be loaded; the message says why
     */
    public static String version() {
        loadPhoto();
        return PhotoBytes.version();
    }

    /** Loads libquenby_photo.so in the same way. */
    static void loadPhoto() {
        if (!photoLoaded) {
            load("loadPhoto", "quenby_photo");
            photoLoaded = true;
        }
    }

    private static void load(String method, String library) {
        try {
            Class.forName(DESKTOP).getMethod(method).invoke(null);
        } catch (ClassNotFoundException onADevice) {
            System.loadLibrary(library); // once, whoever else asks for it
        } catch (InvocationTargetException error) {
            throw (UnsatisfiedLinkError) new UnsatisfiedLinkError(error.getCause().getMessage())
                    .initCause(error.getCause());
        } catch (ReflectiveOperationException error) {
            throw new LinkageError("quenby-desktop is of another version", error);
        }
    }
}
