package moka;

import android.graphics.Bitmap;
import com.velmora.android.sdk.pen.graphics.MokaBitmapFactory;
import java.awt.image.BufferedImage;
import java.io.IOException;
import java.nio.ByteBuffer;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Arrays;
import java.util.Random;
import javax.imageio.ImageIO;

/** Files that the SDK's factory decodes for native code; the argument is one that Java cannot read. */
public final class DecodeTest {
    private static final Path folder = Path.of(".");

    public static void main(String[] arguments) throws Exception {
        Path alpha = savePng("alpha-\u00e9\ud83d\ude00.png", BufferedImage.TYPE_INT_ARGB);
        Host.expect(Host.decodeThroughJava(alpha.toString(), 0, 0) == 0, "decoded too early");
        Host.expect(Host.loadBridge() == 1, "the bridge");
        sameAsNatively(alpha);
        Host.expect(Host.decodeThroughJava(alpha.toString(), 5, 3) == (5L << 32 | 3), "the size is not handed over");
        sameAsNatively(savePng("opaque.png", BufferedImage.TYPE_INT_RGB));
        sameAsNatively(savePng("gray.png", BufferedImage.TYPE_BYTE_GRAY));
        sameAsNatively(savePng("palette.png", BufferedImage.TYPE_BYTE_INDEXED));
        Host.expect(MokaBitmapFactory.decodeFile(arguments[0], 0, 0) == null, "Java reads WebP now");
        sameAsNatively(Path.of(arguments[0]));
        scalesAsAsked();
        refusesWhatNobodyCanRead(alpha);
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
        Host.expect(ImageIO.write(image, "png", path.toFile()), "no writer for " + name);
        return path;
    }

    /** Two decoders and two ways, bit for bit. */
    private static void sameAsNatively(Path path) {
        Host.expect(Host.isDecodedAlike(path.toString()), path.toString());
    }

    private static void scalesAsAsked() throws IOException {
        // Left half 200, right half 100: no size below mixes them but at the middle.
        BufferedImage image = new BufferedImage(64, 48, BufferedImage.TYPE_INT_RGB);
        for (int i = 0; i < 64 * 48; ++i) {
            image.setRGB(i % 64, i / 64, i % 64 < 32 ? 0xc8c8c8 : 0x646464);
        }
        String path = write(image, "halves.png").toString();
        int[][] sizes = {{8, 6}, {9, 47}, {64, 1}, {200, 100}, {64, 48}, {1, 1}, {0, 9}, {9, 0}, {-1, 9}};
        for (int[] size : sizes) {
            Bitmap bitmap = MokaBitmapFactory.decodeFile(path, size[0], size[1]);
            boolean isScaled = size[0] > 0 && size[1] > 0;
            int width = isScaled ? size[0] : 64;
            Host.expect(bitmap.getWidth() == width && bitmap.getHeight() == (isScaled ? size[1] : 48)
                    && bitmap.getConfig() == Bitmap.Config.ARGB_8888, Arrays.toString(size));
            ByteBuffer pixels = ByteBuffer.allocate(bitmap.getRowBytes() * bitmap.getHeight());
            bitmap.copyPixelsToBuffer(pixels);
            int right = pixels.get((width - 1) * 4) & 0xff;
            int left = pixels.get(0) & 0xff;
            Host.expect((left + " " + right).equals(width == 1 ? "150 150" : "200 100"), "ends of " + width);
            bitmap.recycle();
            Host.expectThrown(IllegalStateException.class, () -> {
                bitmap.copyPixelsToBuffer(pixels);
                return null;
            });
        }
    }

    private static void refusesWhatNobodyCanRead(Path whole) throws IOException {
        Path cut = Files.write(folder.resolve("cut.png"), Arrays.copyOf(Files.readAllBytes(whole), 40));
        Path text = Files.writeString(folder.resolve("text.jpg"), "not an image");
        for (Path path : new Path[] {cut, text, folder, folder.resolve("missing.png")}) {
            Host.expect(MokaBitmapFactory.decodeFile(path.toString(), 3, 3) == null, path + " is read");
            Host.expect(Host.decodeThroughJava(path.toString(), 0, 0) == 0, path + " is decoded");
        }
    }
}
