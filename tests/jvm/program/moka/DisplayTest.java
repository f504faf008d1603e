package moka;

import com.velmora.android.sdk.pen.view.MokaDisplay;
import java.lang.reflect.Method;
import java.util.Arrays;

/** Displays made, copied, changed and freed in Java, and read through the native interface. */
public final class DisplayTest {
    private static final int DENSITY_DPI = 7;
    private static final int SCREEN_ORIENTATION = 12;
    private static final int IS_TABLET = 13;
    private static final int DEBUG_LEVEL = 17;

    public static void main(String[] arguments) throws Exception {
        System.loadLibrary("MokaGraphics");
        MokaDisplay display = new MokaDisplay(1, -2, 3.5f, 4, 5, 6.25f, 7.125f, 8, 9.5f, -10.5f, 11, 12,
                Integer.MIN_VALUE, true, 0x1234567890abL);
        double[] expected = {1, -2, 3.5, 4, 5, 6.25, 7.125, 8, 9.5, -10.5, 11, 12, Integer.MIN_VALUE, 1,
            0, 0x1234567890abL, 0, 0};
        same(expected, display);
        display.setDebugLevel(-3);
        display.updateScreenOrientation(99);
        expected[DEBUG_LEVEL] = -3;
        expected[SCREEN_ORIENTATION] = 99;
        same(expected, display);

        try (MokaDisplay copy = new MokaDisplay(0, 0, 2, 0, 0, 0, 0, 320, 0, 0, 0, 0, 0, false, 0)) {
            copy.copy(display);
            expected[DENSITY_DPI] = 320;
            expected[IS_TABLET] = 0;
            same(expected, copy);
            Expect.thrown(NullPointerException.class, "", () -> {
                copy.copy(null);
                return null;
            });
        }
        display.close();
        display.close();
        Expect.thrown(IllegalStateException.class, "closed", display::getHandle);
        Method free = MokaDisplay.class.getDeclaredMethod("Native_finalize", long.class);
        free.setAccessible(true);
        free.invoke(null, 0L);
    }

    private static void same(double[] expected, MokaDisplay display) {
        double[] found = Host.readDisplay(display.getHandle());
        Expect.equal(Arrays.toString(expected), Arrays.toString(found), "display");
    }
}
