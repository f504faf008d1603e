package moka;

import com.velmora.android.sdk.pen.view.MokaDisplay;

/**
 * What System.loadLibrary does, and the end of a display. The loader's thread, which waits for ever, must not keep the
 * process.
 */
public final class LoadTest {
    private static final String ON_LOAD = "BitmapLoader void BitmapLoader_OnLoad(JavaVM *, JNIEnv *)";
    private static final String LOOP =
            "BitmapLoader static void Moka::BitmapLoaderGlue::Native_startEventLoop(JNIEnv *, jclass)";

    public static void main(String[] arguments) throws Exception {
        Host.takeLog();
        System.loadLibrary("MokaGraphics");
        String expected = String.join("\n", "Graphics JNI_OnLoad enter!!", "Display JNI_OnLoad enter!!",
                "Display JNI_OnLoad Success", ON_LOAD + " JNI_OnLoad enter!", ON_LOAD + " JNI_OnLoad Success!",
                "Graphics JNI_OnLoad Success") + "\n";
        String logged = Host.takeLog();
        // The loader's thread logs when it gets to it.
        String ofThisThread = logged.replace(LOOP + "\n", "").replaceAll("BitmapLoaderImpl::[^\n]*\n", "");
        Host.expect(ofThisThread.contains(expected), "logged " + logged);
        for (int i = 0; i < 1000 && !logged.contains(LOOP); ++i, logged = Host.takeLog()) {
            Thread.sleep(10);
        }
        Host.expect(Thread.getAllStackTraces().keySet().stream()
                .filter(thread -> thread.getName().equals("MokaBitmapLoader thread") && thread.isDaemon())
                .count() == 1, "the loader's thread");

        MokaDisplay display = new MokaDisplay(1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, true, 14);
        display.close();
        display.close();
        Host.expectThrown(IllegalStateException.class, display::getHandle);
    }
}
