package com.pelorin.photos.quenby.autoenhance;

import java.lang.reflect.InvocationTargetException;

/** The library behind {@link QuenbyEngine} and {@link ImageDupeDetector}, libpn_quenby.so. */
public final class NativeLibrary {
    private static final String DESKTOP = "com.pelorin.photos.quenby.desktop.NativeLibraries";

    private static volatile boolean loaded;

    private NativeLibrary() {}

    /**
     * Loads the library unless that has been done: on a device as the application's, elsewhere as
     * {@code quenby-desktop} does. Any thread may call, several at once too; what failed is tried
     * anew at the next call. Nothing here or in the classes that loading initialises waits for a
     * class to be initialised, so no order of first uses can block.
     *
     * @throws UnsatisfiedLinkError when it cannot be loaded; the message says why
     */
    public static void load() {
        if (loaded) {
            return;
        }
        try {
            Class.forName(DESKTOP).getMethod("load").invoke(null);
        } catch (ClassNotFoundException onADevice) {
            System.loadLibrary("pn_quenby"); // once, whoever else asks for it
        } catch (InvocationTargetException error) {
            throw (UnsatisfiedLinkError) new UnsatisfiedLinkError(error.getCause().getMessage())
                    .initCause(error.getCause());
        } catch (ReflectiveOperationException error) {
            throw new LinkageError("quenby-desktop is of another version", error);
        }
        loaded = true;
    }
}
