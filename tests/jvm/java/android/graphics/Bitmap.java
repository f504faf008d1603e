package android.graphics;

import java.nio.Buffer;
import java.nio.ByteBuffer;

/** What native code calls of Android's class, over bytes that the test gives; fails where it is told to. */
public class Bitmap {
    public enum Config { ALPHA_8, RGB_565, ARGB_4444, ARGB_8888, RGBA_F16, HARDWARE }

    private final int width;
    private final int height;
    private final int rowBytes;
    private final Config config;
    private final byte[] pixels;
    private final String failing;
    public int recycled;

    /** config and failing (the method that throws) may be null; pixels are rowBytes * height bytes. */
    public Bitmap(int width, int height, int rowBytes, String config, byte[] pixels, String failing) {
        this.width = width;
        this.height = height;
        this.rowBytes = rowBytes;
        this.config = config == null ? null : Config.valueOf(config);
        this.pixels = pixels;
        this.failing = failing == null ? "" : failing;
    }

    public int getWidth() { failIn("getWidth"); return width; }
    public int getHeight() { failIn("getHeight"); return height; }
    public int getRowBytes() { failIn("getRowBytes"); return rowBytes; }
    public Config getConfig() { failIn("getConfig"); return config; }

    /** Like Android's, throws when the buffer is too small for all rows with their padding. */
    public void copyPixelsToBuffer(Buffer target) {
        failIn("copyPixelsToBuffer");
        ((ByteBuffer) target).put(pixels);
    }

    public void recycle() { failIn("recycle"); ++recycled; }

    private void failIn(String method) {
        if (failing.equals("mute " + method)) throw new Mute();
        if (failing.equals(method)) throw new IllegalStateException(method + " was told to");
    }

    /** An exception that throws again when it is asked what it is. */
    static class Mute extends RuntimeException {
        private static final long serialVersionUID = 1;

        @Override
        public String toString() { throw new IllegalStateException("no comment"); }
    }
}
