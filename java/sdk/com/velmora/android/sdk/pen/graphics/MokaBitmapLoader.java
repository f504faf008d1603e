package com.velmora.android.sdk.pen.graphics;

import java.util.concurrent.atomic.AtomicBoolean;

/**
 * Provides the thread of the native bitmap loader. The native library creates one object while it is being loaded;
 * applications need not create any.
 */
public final class MokaBitmapLoader {
    private static final AtomicBoolean started = new AtomicBoolean();

    /**
     * Starts the loader's thread, a daemon, which handles requests until the process ends. A process has one such thread:
     * constructing another loader starts none, because two would process each request twice.
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
