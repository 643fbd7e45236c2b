package com.pelorin.photos.quenby.autoenhance;

import android.graphics.Bitmap;
import com.pelorin.photos.quenby.desktop.BitmapImages;
import java.io.File;
import java.io.IOException;
import java.nio.ByteBuffer;
import java.nio.file.Path;
import javax.imageio.ImageIO;

/** Pictures that tests make. */
final class Pictures {
    static final String ALL_PARAMETERS = "slider=0.6;s1=0.4;s2=0.6;s3=0.5;s4=0.55;";

    private Pictures() {}

    /** Shading, edges and a little texture, in every channel. */
    static Bitmap photo(int width, int height, int seed) {
        Bitmap bitmap = Bitmap.createBitmap(width, height, Bitmap.Config.ARGB_8888);
        fill(bitmap, seed);
        return bitmap;
    }

    static void fill(Bitmap bitmap, int seed) {
        int width = bitmap.getWidth();
        int height = bitmap.getHeight();
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                int texture = (x * 7919 + y * 104729 + seed * 31) % 13;
                int r = (40 + 180 * x / width + texture) & 0xFF;
                int g = (30 + 160 * y / height + texture) & 0xFF;
                int b = x / 16 % 2 == y / 16 % 2 ? 60 + texture : 170 - texture;
                bitmap.setPixel(x, y, 0xFF000000 | r << 16 | g << 8 | b);
            }
        }
    }

    static Bitmap sameSize(Bitmap photo) {
        return Bitmap.createBitmap(photo.getWidth(), photo.getHeight(), Bitmap.Config.ARGB_8888);
    }

    /** All bytes, padding included. */
    static byte[] bytes(Bitmap bitmap) {
        ByteBuffer buffer = ByteBuffer.allocate(bitmap.getByteCount());
        bitmap.copyPixelsToBuffer(buffer);
        return buffer.array();
    }

    static Path jpeg(Path file, int width, int height, int seed) throws IOException {
        File target = file.toFile();
        ImageIO.write(BitmapImages.toOpaqueImage(photo(width, height, seed)), "jpeg", target);
        return file;
    }
}
