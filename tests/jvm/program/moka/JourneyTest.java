package moka;

import java.awt.image.BufferedImage;
import java.io.File;
import java.util.List;
import javax.imageio.ImageIO;

/**
 * A JPEG through the native loader, on the thread that Java lends it, into a bitmap on the GPU, painted on
 * and saved. Then main returns while the loader waits for more: the process must end all the same.
 */
public final class JourneyTest {
    private static final int PAINTED = 0xff2040c0;

    public static void main(String[] arguments) throws Exception {
        System.loadLibrary("MokaGraphics");
        Expect.equal(1, Host.loadBridge(), "the bridge");
        File from = File.createTempFile("moka", ".jpg");
        File to = File.createTempFile("moka", ".png");
        try {
            travel(from, to);
        } finally {
            from.delete();
            to.delete();
        }
    }

    private static void travel(File from, File to) throws Exception {
        BufferedImage photo = new BufferedImage(200, 120, BufferedImage.TYPE_INT_RGB);
        for (int i = 0; i < 200 * 120; ++i) {
            photo.setRGB(i % 200, i / 200, i % 200 << 16 | i / 200 << 8 | 0x40);
        }
        Expect.isTrue(ImageIO.write(photo, "jpg", from), "no writer for JPEG");
        Host.log();
        Expect.equal("MokaBitmapLoader thread", Host.loadDrawSave(from.getPath(), to.getPath()), "journey");
        List<String> log = Host.log();
        Expect.isTrue(log.stream().anyMatch(text -> text.startsWith("MKBitmapFactory::CreateBitmapJNI")),
                "not decoded by Java");

        // Outside of the rectangle, what Java decodes: nothing may be lost on the way to the GPU and back.
        BufferedImage decoded = ImageIO.read(from);
        BufferedImage result = ImageIO.read(to);
        Expect.equal("200x120", result.getWidth() + "x" + result.getHeight(), "size");
        for (int i = 0; i < 200 * 120; ++i) {
            int x = i % 200;
            int y = i / 200;
            boolean isPainted = x >= 20 && x < 60 && y >= 10 && y < 50;
            int expected = isPainted ? PAINTED : decoded.getRGB(x, y);
            Expect.equal(Integer.toHexString(expected), Integer.toHexString(result.getRGB(x, y)),
                    "pixel " + x + ", " + y);
        }
    }
}
