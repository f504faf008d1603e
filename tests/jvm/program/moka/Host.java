package moka;

import java.util.concurrent.Callable;

/** The native side of the test programs, what an application's own library would do; and what they check with. */
final class Host {
    static {
        System.loadLibrary("moka_jvm_host");
    }

    private Host() {}

    /** The width in the upper half, the height in the lower one. 0 when the file is not decoded. */
    static native long decodeThroughJava(String path, int width, int height);

    /** Whether Java and the native codecs decode the file, to the same pixels. */
    static native boolean isDecodedAlike(String path);

    /** What MKBitmapFactory_OnLoad returns. */
    static native int loadBridge();

    /** The texts that were logged since the last call, each with a line break. */
    static native String takeLog();

    /** The first thing that does not hold ends the program. */
    static void expect(boolean holds, String what) {
        if (!holds) throw new AssertionError(what);
    }

    static void expectThrown(Class<? extends Throwable> type, Callable<?> body) {
        try {
            body.call();
        } catch (Throwable thrown) {
            expect(type.isInstance(thrown), "expected " + type.getName() + ", got " + thrown);
            return;
        }
        throw new AssertionError(type.getName() + " was not thrown");
    }
}
