package android.graphics;

import java.nio.Buffer;
import java.nio.ByteBuffer;
import java.util.Objects;

/**
 * The parts of Android's class that the SDK uses, for desktop Java: four bytes a pixel, R, G, B, A, premultiplied, rows
 * without padding.
 */
public final class Bitmap {
    /** The format of pixels. This class supports only {@code ARGB_8888}. */
    public enum Config { ALPHA_8, RGB_565, ARGB_4444, ARGB_8888, RGBA_F16, HARDWARE }

    private static final int BYTES_PER_PIXEL = 4;

    private final int width;
    private final int height;
    private byte[] pixels;

    /** Uses the array without copying it. */
    Bitmap(int width, int height, byte[] pixels) {
        this.width = width;
        this.height = height;
        this.pixels = pixels;
    }

    public int getWidth() {
        return width;
    }

    public int getHeight() {
        return height;
    }

    public Config getConfig() {
        return Config.ARGB_8888;
    }

    public int getRowBytes() {
        return width * BYTES_PER_PIXEL;
    }

    public boolean isPremultiplied() {
        return true;
    }

    public boolean isRecycled() {
        return pixels == null;
    }

    /** Frees the pixels at once. Recycling again does nothing. */
    public void recycle() {
        pixels = null;
    }

    /** Copies all rows to the buffer's position and advances the position. */
    public void copyPixelsToBuffer(Buffer target) {
        byte[] source = requirePixels();
        if (target.remaining() < source.length) {
            throw new RuntimeException("Buffer not large enough for pixels");
        }
        ((ByteBuffer) target).put(source);
    }

    /** Returns the source itself if it has that size. Without filter, uses the nearest pixel. */
    public static Bitmap createScaledBitmap(Bitmap source, int width, int height, boolean filter) {
        Objects.requireNonNull(source);
        if (width <= 0 || height <= 0) {
            throw new IllegalArgumentException("width and height must be > 0");
        }
        if (width == source.width && height == source.height) {
            return source;
        }
        byte[] from = source.requirePixels();
        byte[] to = new byte[Math.multiplyExact(Math.multiplyExact(width, height), BYTES_PER_PIXEL)];
        Axis columns = new Axis(source.width, width, filter);
        Axis rows = new Axis(source.height, height, filter);
        for (int y = 0, i = 0; y < height; ++y) {
            int upper = rows.low[y] * source.width;
            int lower = rows.high[y] * source.width;
            for (int x = 0; x < width; ++x) {
                for (int channel = 0; channel < BYTES_PER_PIXEL; ++channel, ++i) {
                    float top = columns.mix(from, upper, x, channel);
                    float bottom = columns.mix(from, lower, x, channel);
                    to[i] = (byte) Math.round(top + (bottom - top) * rows.weight[y]);
                }
            }
        }
        return new Bitmap(width, height, to);
    }

    /** Averages every n x n block of pixels. Incomplete blocks at the right and the bottom are dropped. */
    Bitmap averageBlocks(int n) {
        byte[] from = requirePixels();
        int smallWidth = width / n;
        int smallHeight = height / n;
        byte[] to = new byte[smallWidth * smallHeight * BYTES_PER_PIXEL];
        for (int i = 0; i < to.length; ++i) {
            int channel = i % BYTES_PER_PIXEL;
            int left = i / BYTES_PER_PIXEL % smallWidth * n;
            int top = i / BYTES_PER_PIXEL / smallWidth * n;
            long sum = 0;
            for (int y = top; y < top + n; ++y) {
                for (int x = left; x < left + n; ++x) {
                    sum += from[(y * width + x) * BYTES_PER_PIXEL + channel] & 0xff;
                }
            }
            to[i] = (byte) ((sum + n * n / 2) / (n * n));
        }
        return new Bitmap(smallWidth, smallHeight, to);
    }

    private byte[] requirePixels() {
        if (pixels == null) {
            throw new IllegalStateException("Can't use a recycled bitmap");
        }
        return pixels;
    }

    /** The positions of the new pixels of a row or a column between the old ones. */
    private static final class Axis {
        final int[] low;
        final int[] high;
        final float[] weight;

        Axis(int from, int to, boolean filter) {
            low = new int[to];
            high = new int[to];
            weight = new float[to];
            for (int i = 0; i < to; ++i) {
                // Aligns pixel centres, and clamps to the outermost pixels.
                float position = Math.max(0, (i + 0.5f) * from / to - (filter ? 0.5f : 0));
                low[i] = Math.min((int) position, from - 1);
                high[i] = Math.min(low[i] + 1, from - 1);
                weight[i] = filter ? position - low[i] : 0;
            }
        }

        float mix(byte[] pixels, int row, int i, int channel) {
            int left = pixels[(row + low[i]) * BYTES_PER_PIXEL + channel] & 0xff;
            int right = pixels[(row + high[i]) * BYTES_PER_PIXEL + channel] & 0xff;
            return left + (right - left) * weight[i];
        }
    }
}
