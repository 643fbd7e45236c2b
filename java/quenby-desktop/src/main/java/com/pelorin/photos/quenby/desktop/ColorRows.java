package com.pelorin.photos.quenby.desktop;

import java.awt.Graphics2D;
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

    /**
     * Writes {@code count} rows from {@code y} on into {@code colors} from 0 on, no more than the
     * first time; opaque images have alpha 255.
     */
    abstract void read(int y, int count, int[] colors);

    /** Whether the colours are multiplied by their alpha. */
    boolean premultiplied() {
        return false;
    }

    /** Those of any image; the usual kinds have ways of their own. */
    static ColorRows of(BufferedImage image) {
        switch (image.getType()) {
            case BufferedImage.TYPE_INT_ARGB:
                return new Ints(image, false, false);
            case BufferedImage.TYPE_INT_ARGB_PRE:
                return new Ints(image, false, true);
            case BufferedImage.TYPE_INT_RGB:
                return new Ints(image, true, false);
            case BufferedImage.TYPE_3BYTE_BGR:
                return new Drawn(image);
            case BufferedImage.TYPE_4BYTE_ABGR:
                return new FourBytes(image);
            case BufferedImage.TYPE_BYTE_GRAY:
                return new Greys(image);
            default:
                return new Any(image);
        }
    }

    private static void makeOpaque(int[] colors) {
        for (int i = 0; i < colors.length; ++i) {
            colors[i] |= 0xFF000000;
        }
    }

    private static final class Any extends ColorRows {
        Any(BufferedImage image) {
            super(image);
        }

        @Override
        void read(int y, int count, int[] colors) {
            image.getRGB(0, y, width, count, colors, 0, width);
        }
    }

    /** An opaque image's, which Java's own drawing unpacks. */
    private static final class Drawn extends ColorRows {
        private BufferedImage band;

        Drawn(BufferedImage image) {
            super(image);
        }

        @Override
        void read(int y, int count, int[] colors) {
            if (band == null) { // no later one is larger
                band = new BufferedImage(width, count, BufferedImage.TYPE_INT_RGB);
            }
            Graphics2D onto = band.createGraphics();
            onto.drawImage(image, 0, -y, null);
            onto.dispose();
            band.getRaster().getDataElements(0, 0, width, count, colors);
            makeOpaque(colors);
        }
    }

    private static final class Ints extends ColorRows {
        private final boolean opaque;
        private final boolean premultiplied;

        Ints(BufferedImage image, boolean opaque, boolean premultiplied) {
            super(image);
            this.opaque = opaque;
            this.premultiplied = premultiplied;
        }

        @Override
        void read(int y, int count, int[] colors) {
            raster.getDataElements(0, y, width, count, colors);
            if (opaque) {
                makeOpaque(colors);
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

        /** Writes one row, whose bytes begin at {@code start}, into {@code colors} from {@code to} on. */
        abstract void readRow(int start, int[] colors, int to);

        @Override
        final void read(int y, int count, int[] colors) {
            for (int i = 0; i < count; ++i) {
                readRow(first + (y + i) * stride, colors, i * width);
            }
        }
    }

    private static final class FourBytes extends Bytes {
        FourBytes(BufferedImage image) {
            super(image);
        }

        @Override
        void readRow(int start, int[] colors, int to) {
            for (int x = 0, i = start; x < width; ++x, i += 4) {
                colors[to + x] = bytes.getElem(i) << 24 | bytes.getElem(i + 3) << 16
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
        void readRow(int start, int[] colors, int to) {
            for (int x = 0, i = start; x < width; ++x, ++i) {
                colors[to + x] = colorOf[bytes.getElem(i)];
            }
        }
    }
}
