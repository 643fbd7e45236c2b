package com.pelorin.photos.quenby.autoenhance;

/** The bare natives, loaded. */
final class Natives {
    private Natives() {}

    static QuenbyEngine engine() {
        NativeLibrary.load();
        return new QuenbyEngine();
    }
}
