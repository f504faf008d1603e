package moka;

import java.util.List;

/** The native side of the test programs: what an application's own library would do. */
final class Host {
    static {
        System.loadLibrary("moka_jvm_host");
    }

    private Host() {}

    /** Width and height, four bytes each, then the pixels, R, G, B, A. Null when the file is not decoded. */
    static native byte[] decodeThroughJava(String path, int width, int height);

    /** The same by the native codecs. */
    static native byte[] decodeNatively(String path);

    static native boolean save(String path, int width, int height, byte[] pixels);

    /** What MKBitmapFactory_OnLoad returns. */
    static native int loadBridge();

    /** Everything that native code reads of a display, in the order of its constructor, then the rest. */
    static native double[] readDisplay(long handle);

    private static native String[] takeLog();

    /** The texts that were logged since the last call. */
    static List<String> log() {
        return List.of(takeLog());
    }
}
