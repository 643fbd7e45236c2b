package com.pelorin.photos.quenby.desktop;

import java.awt.image.BufferedImage;
import java.awt.image.ColorModel;
import java.awt.image.ComponentSampleModel;
import java.awt.image.DataBufferByte;
import java.awt.image.Raster;

/** The colours of an image row by row, as {@link BufferedImage#getRGB} gives them but faster. */
abstract class ColorRows {
    final BufferedImage image;
    final Raster raster;
    final int width;

    private ColorRows(BufferedImage image) {
        this.image = image;
        this.raster = image.getRaster();
        this.width = image.getWidth();
    }

    /** Writes row {@code y} into {@code colors} from 0 on; opaque images have alpha 255. */
    abstract void read(int y, int[] colors);

    /** Whether the colours are multiplied by their alpha. */
    boolean premultiplied() {
        return false;
    }

    /** Those of any image; the usual kinds have ways of their own. */
    static ColorRows of(BufferedImage image) {
        switch (image.getType()) {
            case BufferedImage.TYPE_INT_ARGB:
                return new Ints(image, 0, false);
            case BufferedImage.TYPE_INT_ARGB_PRE:
                return new Ints(image, 0, true);
            case BufferedImage.TYPE_INT_RGB:
                return new Ints(image, 0xFF000000, false);
            case BufferedImage.TYPE_3BYTE_BGR:
                return new ThreeBytes(image);
            case BufferedImage.TYPE_4BYTE_ABGR:
                return new FourBytes(image);
            case BufferedImage.TYPE_BYTE_GRAY:
                return new Greys(image);
            default:
                return new Any(image);
        }
    }

    private static final class Any extends ColorRows {
        Any(BufferedImage image) {
            super(image);
        }

        @Override
        void read(int y, int[] colors) {
            image.getRGB(0, y, width, 1, colors, 0, width);
        }
    }

    private static final class Ints extends ColorRows {
        private final int alpha;
        private final boolean premultiplied;

        Ints(BufferedImage image, int alpha, boolean premultiplied) {
            super(image);
            this.alpha = alpha;
            this.premultiplied = premultiplied;
        }

        @Override
        void read(int y, int[] colors) {
            raster.getDataElements(0, y, width, 1, colors);
            if (alpha != 0) {
                for (int x = 0; x < width; ++x) {
                    colors[x] |= alpha;
                }
            }
        }

        @Override
        boolean premultiplied() {
            return premultiplied;
        }
    }

    /**
     * Bytes where they are: rasters hand them out band by band, slowly. An element read by itself
     * leaves the image to be kept by the graphics processor; the array as a whole would not.
     */
    private abstract static class Bytes extends ColorRows {
        final DataBufferByte bytes;
        private final int first;
        private final int stride;

        Bytes(BufferedImage image) {
            super(image);
            ComponentSampleModel model = (ComponentSampleModel) raster.getSampleModel();
            bytes = (DataBufferByte) raster.getDataBuffer();
            stride = model.getScanlineStride();
            first = -raster.getSampleModelTranslateY() * stride
                    - raster.getSampleModelTranslateX() * model.getPixelStride();
        }

        final int rowStart(int y) {
            return first + y * stride;
        }
    }

    private static final class ThreeBytes extends Bytes {
        ThreeBytes(BufferedImage image) {
            super(image);
        }

        @Override
        void read(int y, int[] colors) {
            for (int x = 0, i = rowStart(y); x < width; ++x, i += 3) {
                colors[x] = 0xFF000000 | bytes.getElem(i + 2) << 16 | bytes.getElem(i + 1) << 8
                        | bytes.getElem(i);
            }
        }
    }

    private static final class FourBytes extends Bytes {
        FourBytes(BufferedImage image) {
            super(image);
        }

        @Override
        void read(int y, int[] colors) {
            for (int x = 0, i = rowStart(y); x < width; ++x, i += 4) {
                colors[x] = bytes.getElem(i) << 24 | bytes.getElem(i + 3) << 16
                        | bytes.getElem(i + 2) << 8 | bytes.getElem(i + 1);
            }
        }
    }

    private static final class Greys extends Bytes {
        private final int[] colorOf = new int[256];

        Greys(BufferedImage image) {
            super(image);
            ColorModel model = image.getColorModel();
            for (int grey = 0; grey < 256; ++grey) {
                colorOf[grey] = model.getRGB(new byte[] {(byte) grey});
            }
        }

        @Override
        void read(int y, int[] colors) {
            for (int x = 0, i = rowStart(y); x < width; ++x, ++i) {
                colors[x] = colorOf[bytes.getElem(i)];
            }
        }
    }
}
