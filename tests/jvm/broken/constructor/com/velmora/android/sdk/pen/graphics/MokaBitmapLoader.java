package com.velmora.android.sdk.pen.graphics;

/** Without the constructor that native code calls. */
public final class MokaBitmapLoader {
    public MokaBitmapLoader(int unused) {}

    private static native void Native_startEventLoop();
}
