package com.velmora.android.sdk.pen.graphics;

import android.graphics.Bitmap;
import android.graphics.BitmapFactory;

/** Decodes image files with the platform's decoders. The native library calls this from any thread. */
public final class MokaBitmapFactory {
    private MokaBitmapFactory() {}

    /**
     * Decodes an image file into a bitmap of the configuration {@code ARGB_8888}, premultiplied.
     *
     * @param path   the file
     * @param width  the width of the bitmap; if width or height is 0 or less, the bitmap has the file's own size
     * @param height the height of the bitmap
     * @return the bitmap, which the caller recycles; null if the file cannot be read
     */
    public static Bitmap decodeFile(String path, int width, int height) {
        boolean isScaled = width > 0 && height > 0;
        BitmapFactory.Options options = new BitmapFactory.Options();
        options.inPreferredConfig = Bitmap.Config.ARGB_8888;
        if (isScaled) {
            options.inSampleSize = chooseSampleSize(path, width, height);
        }
        Bitmap decoded = BitmapFactory.decodeFile(path, options);
        if (decoded == null || !isScaled) {
            return decoded;
        }
        Bitmap scaled = Bitmap.createScaledBitmap(decoded, width, height, true);
        if (scaled != decoded) {
            decoded.recycle();
        }
        return scaled;
    }

    /** The largest power of two by which the decoder can reduce the image without making it too small. */
    private static int chooseSampleSize(String path, int width, int height) {
        BitmapFactory.Options bounds = new BitmapFactory.Options();
        bounds.inJustDecodeBounds = true;
        BitmapFactory.decodeFile(path, bounds);
        int size = 1;
        while (bounds.outWidth / (size * 2) >= width && bounds.outHeight / (size * 2) >= height) {
            size *= 2;
        }
        return size;
    }
}
