package com.pelorin.photos.quenby.autoenhance;

import android.graphics.Bitmap;

/** What the natives take on trust of a bitmap. */
final class Bitmaps {
    private Bitmaps() {}

    static Bitmap requireReadable(Bitmap bitmap, String what) {
        if (bitmap == null) {
            throw new UnsuitableBitmapException(what + " is null");
        }
        if (bitmap.isRecycled()) {
            throw new UnsuitableBitmapException(what + " is recycled");
        }
        if (bitmap.getConfig() != Bitmap.Config.ARGB_8888) {
            throw new UnsuitableBitmapException(
                    what + " is of " + bitmap.getConfig() + ", not of ARGB_8888");
        }
        return bitmap;
    }

    static void requireRoomFor(int width, int height, Bitmap bitmap) {
        requireReadable(bitmap, "the output");
        if (bitmap.getWidth() != width || bitmap.getHeight() != height) {
            throw new UnsuitableBitmapException("the output is " + bitmap.getWidth() + " x "
                    + bitmap.getHeight() + ", the photo " + width + " x " + height);
        }
    }
}
