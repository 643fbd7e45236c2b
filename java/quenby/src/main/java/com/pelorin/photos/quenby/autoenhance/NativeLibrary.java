package com.pelorin.photos.quenby.autoenhance;

import java.lang.reflect.InvocationTargetException;

/** Loads libpn_quenby.so: on a device as the application's, elsewhere as the desktop does. */
final class NativeLibrary {
    private static final String DESKTOP = "com.pelorin.photos.quenby.desktop.NativeLibraries";

    private NativeLibrary() {}

    static void load() {
        try {
            Class.forName(DESKTOP).getMethod("load").invoke(null);
        } catch (ClassNotFoundException onADevice) {
            System.loadLibrary("pn_quenby");
        } catch (InvocationTargetException error) {
            throw (UnsatisfiedLinkError) new UnsatisfiedLinkError(error.getCause().getMessage())
                    .initCause(error.getCause());
        } catch (ReflectiveOperationException error) {
            throw new LinkageError("quenby-desktop is of another version", error);
        }
    }
}
