package com.velmora.android.sdk.pen.graphics;

import android.graphics.Bitmap;

/** Gives or throws what the test put there. */
public final class MokaBitmapFactory {
    public static Bitmap result;
    public static boolean isThrowing;

    private MokaBitmapFactory() {}

    public static Bitmap decodeFile(String path, int width, int height) {
        if (isThrowing) throw new OutOfMemoryError("told to");
        return result;
    }
}
