package com.velmora.android.sdk.pen.graphics;

import java.util.concurrent.atomic.AtomicBoolean;

/**
 * Lends the native bitmap loader its thread. The native library makes one of these while it is being loaded;
 * an application has no need to.
 */
public final class MokaBitmapLoader {
    private static final AtomicBoolean started = new AtomicBoolean();

    /**
     * Starts the loader's thread, a daemon, which serves requests until the process ends. There is one in a
     * process: constructing another loader starts nothing, since two would serve each request twice.
     */
    public MokaBitmapLoader() {
        if (!started.compareAndSet(false, true)) {
            return;
        }
        Thread thread = new Thread(MokaBitmapLoader::Native_startEventLoop, "MokaBitmapLoader thread");
        thread.setDaemon(true);
        thread.start();
    }

    /** Never returns. */
    private static native void Native_startEventLoop();
}
