package com.velmora.android.sdk.pen.view;

/** Without its natives. */
public final class MokaDisplay {}
