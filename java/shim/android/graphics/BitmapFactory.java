package android.graphics;

import java.awt.color.ColorSpace;
import java.awt.image.BufferedImage;
import java.awt.image.ComponentColorModel;
import java.awt.image.Raster;
import java.io.File;
import java.io.IOException;
import java.util.Iterator;
import javax.imageio.ImageIO;
import javax.imageio.ImageReader;
import javax.imageio.stream.ImageInputStream;

/** The parts of Android's class that the SDK uses, with the decoders of desktop Java: JPEG, PNG, GIF, BMP. */
public final class BitmapFactory {
    private BitmapFactory() {}

    /** The options of a decode, and its results. */
    public static class Options {
        /** If true, only the size is read. */
        public boolean inJustDecodeBounds;
        /** The number of pixels, in each direction, that become one; values below 1 mean 1. */
        public int inSampleSize;
        /** The format; only {@code ARGB_8888} is supported. */
        public Bitmap.Config inPreferredConfig = Bitmap.Config.ARGB_8888;
        /** The width, or -1 if the file cannot be read. */
        public int outWidth;
        /** The height, or -1 if the file cannot be read. */
        public int outHeight;
    }

    /** Returns the bitmap; null if the file cannot be read or only its bounds were requested. */
    public static Bitmap decodeFile(String path, Options options) {
        options.outWidth = -1;
        options.outHeight = -1;
        try (ImageInputStream input = ImageIO.createImageInputStream(new File(path))) {
            Iterator<ImageReader> readers = ImageIO.getImageReaders(input);
            if (!readers.hasNext()) {
                return null;
            }
            ImageReader reader = readers.next();
            try {
                reader.setInput(input);
                return decode(reader, options);
            } finally {
                reader.dispose();
            }
        } catch (IOException | RuntimeException e) {
            // For a broken file, readers throw exceptions of any type.
            return null;
        }
    }

    private static Bitmap decode(ImageReader reader, Options options) throws IOException {
        options.outWidth = reader.getWidth(0);
        options.outHeight = reader.getHeight(0);
        if (options.inJustDecodeBounds) {
            return null;
        }
        int bytes = Math.multiplyExact(Math.multiplyExact(options.outWidth, options.outHeight), 4);
        Bitmap bitmap = new Bitmap(options.outWidth, options.outHeight, toPixels(reader.read(0), bytes));
        int sampleSize = Math.min(options.inSampleSize, Math.min(bitmap.getWidth(), bitmap.getHeight()));
        return sampleSize > 1 ? bitmap.averageBlocks(sampleSize) : bitmap;
    }

    private static byte[] toPixels(BufferedImage image, int bytes) {
        byte[] pixels = new byte[bytes];
        int[] row = new int[image.getWidth()];
        boolean isGray = image.getColorModel() instanceof ComponentColorModel
                && image.getColorModel().getColorSpace().getType() == ColorSpace.TYPE_GRAY;
        for (int y = 0, i = 0; y < image.getHeight(); ++y) {
            if (isGray) {
                readGrayRow(image, y, row);
            } else {
                image.getRGB(0, y, row.length, 1, row, 0, row.length);
            }
            for (int argb : row) {
                int alpha = argb >>> 24;
                pixels[i++] = premultiply(argb >> 16, alpha);
                pixels[i++] = premultiply(argb >> 8, alpha);
                pixels[i++] = premultiply(argb, alpha);
                pixels[i++] = (byte) alpha;
            }
        }
        return pixels;
    }

    /** Reads the samples directly, because getRGB treats grey as linear light, which image files do not contain. */
    private static void readGrayRow(BufferedImage image, int y, int[] row) {
        Raster raster = image.getRaster();
        int shift = raster.getSampleModel().getSampleSize(0) - 8;
        boolean hasAlpha = raster.getNumBands() > 1;
        for (int x = 0; x < row.length; ++x) {
            int gray = raster.getSample(x, y, 0) >> shift;
            int alpha = hasAlpha ? raster.getSample(x, y, 1) >> shift : 255;
            row[x] = alpha << 24 | gray * 0x010101;
        }
    }

    /** Rounds to the nearest. */
    private static byte premultiply(int colour, int alpha) {
        return (byte) (((colour & 0xff) * alpha * 2 + 255) / 510);
    }
}
