package com.velmora.android.sdk.pen.graphics;

import android.graphics.Bitmap;

/** Remembers what native code asks of it, and gives or throws what the test put there. */
public final class MokaBitmapFactory {
    public static Bitmap result;
    public static boolean isThrowing;
    public static String path;
    public static String size;

    private MokaBitmapFactory() {}

    public static Bitmap decodeFile(String path, int width, int height) {
        MokaBitmapFactory.path = path;
        size = width + "x" + height;
        if (isThrowing) throw new OutOfMemoryError("told to");
        return result;
    }
}
