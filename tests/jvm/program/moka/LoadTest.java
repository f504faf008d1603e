package moka;

import java.util.List;
import java.util.stream.Collectors;

/** What System.loadLibrary does. The loader's thread, which waits for ever, must not keep the process. */
public final class LoadTest {
    private static final String ON_LOAD = "BitmapLoader void BitmapLoader_OnLoad(JavaVM *, JNIEnv *)";
    private static final String LOOP =
            "BitmapLoader static void Moka::BitmapLoaderGlue::Native_startEventLoop(JNIEnv *, jclass)";

    public static void main(String[] arguments) throws Exception {
        Host.log();
        System.loadLibrary("MokaGraphics");
        List<String> expected = List.of("Graphics JNI_OnLoad enter!!", "Display JNI_OnLoad enter!!",
                "Display JNI_OnLoad Success", ON_LOAD + " JNI_OnLoad enter!",
                ON_LOAD + " JNI_OnLoad Success!", "Graphics JNI_OnLoad Success");
        List<String> logged = Host.log();
        Expect.equal(expected,
                logged.stream().filter(expected::contains).collect(Collectors.toList()), "log");
        for (int i = 0; i < 1000 && !logged.contains(LOOP); ++i, logged = Host.log()) {
            Thread.sleep(10);
        }
        Expect.isTrue(logged.contains(LOOP), "the loader's thread did not come");
        long threads = Thread.getAllStackTraces().keySet().stream()
                .filter(thread -> thread.getName().equals("MokaBitmapLoader thread") && thread.isDaemon())
                .count();
        Expect.equal(1L, threads, "loader threads");
    }
}
