package com.velmora.android.sdk.pen.graphics;

/** Without its native. */
public final class MokaBitmapLoader {}
