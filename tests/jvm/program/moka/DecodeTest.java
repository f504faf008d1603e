package moka;

import android.graphics.Bitmap;
import com.velmora.android.sdk.pen.graphics.MokaBitmapFactory;
import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.nio.ByteBuffer;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Arrays;
import java.util.Random;
import javax.imageio.ImageIO;

/** Files that the SDK's factory decodes for native code. */
public final class DecodeTest {
    private static Path folder;

    public static void main(String[] arguments) throws Exception {
        folder = Files.createTempDirectory("moka");
        try {
            Path alpha = savePng("alpha-\u00e9\ud83d\ude00.png", BufferedImage.TYPE_INT_ARGB);
            Expect.isTrue(Host.decodeThroughJava(alpha.toString(), 0, 0) == null, "decoded too early");
            Expect.equal(1, Host.loadBridge(), "the bridge");
            sameAsNatively(alpha);
            sameAsNatively(savePng("opaque.png", BufferedImage.TYPE_INT_RGB));
            sameAsNatively(savePng("gray.png", BufferedImage.TYPE_BYTE_GRAY));
            sameAsNatively(savePng("palette.png", BufferedImage.TYPE_BYTE_INDEXED));
            alphaIsMultiplied();
            scalesAsAsked();
            readsWhatJavaCannot();
            refusesWhatNobodyCan();
        } finally {
            try (var files = Files.walk(folder)) {
                files.sorted((a, b) -> b.compareTo(a)).map(Path::toFile).forEach(File::delete);
            }
        }
    }

    private static Path savePng(String name, int type) throws IOException {
        BufferedImage image = new BufferedImage(37, 29, type);
        Random random = new Random(1);
        for (int i = 0; i < 37 * 29; ++i) {
            image.setRGB(i % 37, i / 37, random.nextInt());
        }
        return write(image, name);
    }

    private static Path write(BufferedImage image, String name) throws IOException {
        Path path = folder.resolve(name);
        Expect.isTrue(ImageIO.write(image, "png", path.toFile()), "no writer for " + name);
        return path;
    }

    /** Two decoders and two ways, bit for bit. */
    private static void sameAsNatively(Path path) {
        byte[] ours = Host.decodeThroughJava(path.toString(), 0, 0);
        Expect.isTrue(ours != null, path + " is not decoded");
        Expect.equal(Host.decodeNatively(path.toString()), ours, path.toString());
    }

    private static void alphaIsMultiplied() throws IOException {
        BufferedImage image = new BufferedImage(2, 1, BufferedImage.TYPE_INT_ARGB);
        image.setRGB(0, 0, 0x80ff4001);
        image.setRGB(1, 0, 0x00ffffff);
        byte[] expected = {(byte) 0x80, 0x20, 1, (byte) 0x80, 0, 0, 0, 0};
        byte[] decoded = Host.decodeThroughJava(write(image, "half.png").toString(), 0, 0);
        Expect.equal(expected, Arrays.copyOfRange(decoded, 8, 16), "premultiplied");
    }

    private static void scalesAsAsked() throws IOException {
        // Left half 200, right half 100: no size below mixes them but at the middle.
        BufferedImage image = new BufferedImage(64, 48, BufferedImage.TYPE_INT_RGB);
        for (int i = 0; i < 64 * 48; ++i) {
            image.setRGB(i % 64, i / 64, i % 64 < 32 ? 0xc8c8c8 : 0x646464);
        }
        String path = write(image, "halves.png").toString();
        int[][] sizes = {{8, 6}, {9, 47}, {64, 1}, {200, 100}, {64, 48}, {1, 1}};
        for (int[] size : sizes) {
            Bitmap bitmap = MokaBitmapFactory.decodeFile(path, size[0], size[1]);
            Expect.equal(size[0] + "x" + size[1], bitmap.getWidth() + "x" + bitmap.getHeight(), "size");
            Expect.equal(Bitmap.Config.ARGB_8888, bitmap.getConfig(), "configuration");
            ByteBuffer pixels = ByteBuffer.allocate(bitmap.getRowBytes() * bitmap.getHeight());
            bitmap.copyPixelsToBuffer(pixels);
            int right = pixels.get((size[0] - 1) * 4) & 0xff;
            int left = pixels.get(0) & 0xff;
            Expect.equal(size[0] == 1 ? "150 150" : "200 100", left + " " + right, "ends of " + size[0]);
            Expect.equal(255, pixels.get(3) & 0xff, "alpha");
            bitmap.recycle();
            Expect.thrown(IllegalStateException.class, "recycled", () -> {
                bitmap.copyPixelsToBuffer(pixels);
                return null;
            });
        }
        for (int[] size : new int[][] {{0, 9}, {9, 0}, {-1, 9}}) {
            Bitmap bitmap = MokaBitmapFactory.decodeFile(path, size[0], size[1]);
            Expect.equal("64x48", bitmap.getWidth() + "x" + bitmap.getHeight(), "own size");
        }
    }

    private static void readsWhatJavaCannot() {
        String path = folder.resolve("a.webp").toString();
        byte[] pixels = {1, 2, 3, (byte) 255, 4, 5, 6, (byte) 255};
        Expect.isTrue(Host.save(path, 1, 2, pixels), "saving");
        Expect.isTrue(MokaBitmapFactory.decodeFile(path, 0, 0) == null, "Java reads WebP now");
        sameAsNatively(Path.of(path));
    }

    private static void refusesWhatNobodyCan() throws IOException {
        Path whole = savePng("whole.png", BufferedImage.TYPE_INT_ARGB);
        byte[] bytes = Files.readAllBytes(whole);
        Path cut = folder.resolve("cut.png");
        Path text = folder.resolve("text.jpg");
        Files.write(cut, Arrays.copyOf(bytes, 40));
        Files.writeString(text, "not an image");
        for (Path path : new Path[] {cut, text, folder, folder.resolve("missing.png")}) {
            Expect.isTrue(MokaBitmapFactory.decodeFile(path.toString(), 0, 0) == null, path + " is read");
            Expect.isTrue(MokaBitmapFactory.decodeFile(path.toString(), 3, 3) == null, path + " is read");
            Expect.isTrue(Host.decodeThroughJava(path.toString(), 0, 0) == null, path + " is decoded");
        }
    }
}
