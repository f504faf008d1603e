package moka;

import com.velmora.android.sdk.pen.view.MokaDisplay;
import java.lang.reflect.Method;
import java.util.Arrays;

/** Displays made, copied, changed and freed in Java, and read through the native interface. */
public final class DisplayTest {
    private static final int DENSITY_DPI = 7;
    private static final int SCREEN_ORIENTATION = 12;
    private static final int IS_TABLET = 13;
    private static final int IS_TABLET_UX = 16;
    private static final int DEBUG_LEVEL = 17;

    public static void main(String[] arguments) throws Exception {
        System.loadLibrary("MokaGraphics");
        everyArgumentArrivesWhereItBelongs();
        copyLeavesTwoFieldsAlone();
        closedDisplaysRefuse();
    }

    private static void everyArgumentArrivesWhereItBelongs() {
        try (MokaDisplay display = new MokaDisplay(1, -2, 3.5f, 4, 5, 6.25f, 7.125f, 8, 9.5f, -10.5f, 11, 12,
                Integer.MIN_VALUE, true, 0x1234567890abL)) {
            double[] expected = {1, -2, 3.5, 4, 5, 6.25, 7.125, 8, 9.5, -10.5, 11, 12, Integer.MIN_VALUE, 1,
                0, 0x1234567890abL, 0, 0};
            same(expected, display);
            display.setDebugLevel(-3);
            display.updateScreenOrientation(99);
            expected[DEBUG_LEVEL] = -3;
            expected[SCREEN_ORIENTATION] = 99;
            same(expected, display);
        }
    }

    private static void copyLeavesTwoFieldsAlone() {
        try (MokaDisplay source =
                        new MokaDisplay(1, 2, 2.0f, 1080, 1920, 6, 7, 8, 9, 10, 11, 12, 13, true, 15);
                MokaDisplay target =
                        new MokaDisplay(0, 0, 2.25f, 1080, 1920, 0, 0, 320, 0, 0, 0, 0, 0, false, 0)) {
            Expect.equal(1.0, read(source)[IS_TABLET_UX], "1080 at density 2");
            Expect.equal(0.0, read(target)[IS_TABLET_UX], "1080 at density 2.25");
            source.setDebugLevel(5);
            target.copy(source);
            double[] expected = read(source);
            expected[DENSITY_DPI] = 320;
            expected[IS_TABLET] = 0;
            same(expected, target);
            Expect.thrown(NullPointerException.class, "", () -> {
                target.copy(null);
                return null;
            });
        }
    }

    private static void closedDisplaysRefuse() throws Exception {
        MokaDisplay display = new MokaDisplay(1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1, 1, false, 1);
        display.close();
        display.close();
        Expect.thrown(IllegalStateException.class, "closed", display::getHandle);
        Method free = MokaDisplay.class.getDeclaredMethod("Native_finalize", long.class);
        free.setAccessible(true);
        free.invoke(null, 0L);
    }

    private static double[] read(MokaDisplay display) {
        return Host.readDisplay(display.getHandle());
    }

    private static void same(double[] expected, MokaDisplay display) {
        Expect.equal(Arrays.toString(expected), Arrays.toString(read(display)), "display");
    }
}
