package com.velmora.android.sdk.pen.view;

/**
 * The metrics of the device's screen, stored in a native object for native code. Not synchronised. The native library
 * must be loaded.
 */
public final class MokaDisplay implements AutoCloseable {
    private long handle;

    /**
     * Creates the native display. The numbers of direction and orientations are stored unchanged.
     *
     * @param widthPixels         the screen's width
     * @param heightPixels        the screen's height
     * @param systemDensity       the system's density factor
     * @param localWidthPixels    the width of the application's own area
     * @param localHeightPixels   the height of that area
     * @param density             the density factor
     * @param scaledDensity       the density factor of fonts
     * @param densityDpi          the density in dots per inch
     * @param xdpi                horizontal dots per inch
     * @param ydpi                vertical dots per inch
     * @param layoutDirection     the direction that text is laid out in
     * @param orientation         the device's orientation
     * @param screenOrientation   the screen's orientation
     * @param isTablet            whether the device is a tablet
     * @param appVsyncOffsetNanos the application's vsync offset
     */
    public MokaDisplay(int widthPixels, int heightPixels, float systemDensity, int localWidthPixels,
            int localHeightPixels, float density, float scaledDensity, int densityDpi, float xdpi, float ydpi,
            int layoutDirection, int orientation, int screenOrientation, boolean isTablet,
            long appVsyncOffsetNanos) {
        handle = Native_init(widthPixels, heightPixels, systemDensity, localWidthPixels, localHeightPixels,
                density, scaledDensity, densityDpi, xdpi, ydpi, layoutDirection, orientation,
                screenOrientation, isTablet, appVsyncOffsetNanos);
        if (handle == 0) {
            throw new OutOfMemoryError("no memory for a native display");
        }
    }

    /**
     * The native display, for native code: the address of a {@code Moka::Display}, until {@link #close}.
     *
     * @return the address, never 0
     */
    public long getHandle() {
        if (handle == 0) {
            throw new IllegalStateException("the display is closed");
        }
        return handle;
    }

    /**
     * Copies all values of another display, except the density in dots per inch and whether the device is a tablet.
     *
     * @param source the other display
     */
    public void copy(MokaDisplay source) {
        Native_copy(getHandle(), source.getHandle());
    }

    /**
     * Sets the debug level of native code; initially 0.
     *
     * @param level the level
     */
    public void setDebugLevel(int level) {
        Native_setDebugLevel(getHandle(), level);
    }

    /**
     * Sets the screen's orientation.
     *
     * @param orientation the orientation
     */
    public void updateScreenOrientation(int orientation) {
        Native_updateScreenOrientation(getHandle(), orientation);
    }

    /** Frees the native display. Closing again does nothing. */
    @Override
    public void close() {
        Native_finalize(handle);
        handle = 0;
    }

    private static native long Native_init(int widthPixels, int heightPixels, float systemDensity,
            int localWidthPixels, int localHeightPixels, float density, float scaledDensity, int densityDpi,
            float xdpi, float ydpi, int layoutDirection, int orientation, int screenOrientation,
            boolean isTablet, long appVsyncOffsetNanos);

    private static native void Native_finalize(long handle);

    private static native void Native_copy(long destination, long source);

    private static native void Native_setDebugLevel(long handle, int level);

    private static native void Native_updateScreenOrientation(long handle, int orientation);
}
