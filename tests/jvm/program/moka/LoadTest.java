package moka;

import java.io.File;
import java.lang.reflect.InvocationTargetException;
import java.net.URL;
import java.util.List;
import java.util.concurrent.Callable;
import java.util.stream.Collectors;

/** What comes out of System.loadLibrary, with all classes and without some. */
public final class LoadTest {
    private static final String DISPLAY = "com.velmora.android.sdk.pen.view.MokaDisplay";
    private static final String LOADER = "com.velmora.android.sdk.pen.graphics.MokaBitmapLoader";
    private static final String ON_LOAD = "BitmapLoader void BitmapLoader_OnLoad(JavaVM *, JNIEnv *)";
    private static final String LOOP =
            "BitmapLoader static void Moka::BitmapLoaderGlue::Native_startEventLoop(JNIEnv *, jclass)";

    /** Classes look for what they load with the class loader of their own. */
    public static final class Loading implements Callable<Void> {
        @Override
        public Void call() {
            System.loadLibrary("MokaGraphics");
            return null;
        }
    }

    public static void main(String[] arguments) throws Exception {
        Host.log();
        URL noNatives = new File(arguments[1]).toURI().toURL();
        URL noConstructor = new File(arguments[2]).toURI().toURL();
        if (arguments[0].equals("display")) {
            // The loader is registered all the same, and its thread started; under the exception.
            fails(DISPLAY, null, NoClassDefFoundError.class, "MokaDisplay", "Cannot find Display Class");
            fails(DISPLAY, noNatives, NoSuchMethodError.class, "Native_init", "RegisterNatives is failed");
            return;
        }
        fails(LOADER, null, NoClassDefFoundError.class, "MokaBitmapLoader",
                ON_LOAD + "Cannot find BitmapLoader Class");
        fails(LOADER, noNatives, NoSuchMethodError.class, "Native_startEventLoop",
                ON_LOAD + "RegisterNatives is failed");
        fails(LOADER, noConstructor, NoSuchMethodError.class, "<init>", "Graphics JNI_OnLoad Success");
        succeeds();
    }

    private static void fails(String shadowed, URL jar, Class<? extends Throwable> type, String text,
            String logged) throws Exception {
        try (ShadowLoader loader = new ShadowLoader(shadowed, jar)) {
            Expect.thrown(type, text, () -> load(loader));
        }
        Expect.isTrue(Host.log().contains(logged), "not logged: " + logged);
    }

    private static Void load(ClassLoader loader) throws Exception {
        try {
            Class<?> loading = loader.loadClass(Loading.class.getName());
            loading.getMethod("call").invoke(loading.getConstructor().newInstance());
        } catch (InvocationTargetException e) {
            if (e.getCause() instanceof Error) throw (Error) e.getCause();
            throw e;
        }
        return null;
    }

    private static void succeeds() throws InterruptedException {
        Host.log();
        new Loading().call();
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
