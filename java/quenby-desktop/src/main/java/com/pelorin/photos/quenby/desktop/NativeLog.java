package com.pelorin.photos.quenby.desktop;

/** What the native libraries write to standard error. */
public final class NativeLog {
    /** Everything. */
    public static final int VERBOSE = 2;
    /** Progress, such as a line for each session and face. */
    public static final int DEBUG = 3;
    /** Nothing below information; how the libraries start. */
    public static final int INFO = 4;
    /** Warnings and failures. */
    public static final int WARN = 5;
    /** Failures. */
    public static final int ERROR = 6;
    /** Nothing at all. */
    public static final int SILENT = 8;

    private NativeLog() {}

    /**
     * Drops lines below a priority from now on, in the whole process. Loads the native libraries,
     * if that has not been done.
     *
     * @param priority one of the constants
     * @throws UnsatisfiedLinkError when they cannot be loaded
     */
    public static void setPriority(int priority) {
        NativeLibraries.load();
        setLeastPriority(priority);
    }

    private static native void setLeastPriority(int priority);
}
