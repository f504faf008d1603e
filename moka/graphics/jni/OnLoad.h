/// OnLoad.h: where Java and its host enter the library. Java calls JNI_OnLoad when it loads the library,
/// which registers the natives of MokaDisplay and MokaBitmapLoader. Nobody but the host calls
/// MKBitmapFactory_OnLoad.
/// Thread: the one that loads, before anything else of the library is used.
/// Fails:  missing classes and methods are logged. JNI_OnLoad and the two it calls leave Java's exception
///         pending: it comes out of System.loadLibrary.
#pragma once

#include "moka/base/Export.h"

#include <jni.h>

extern "C" {

/// The version of JNI that is needed, or 0, which Java takes for a failure.
JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void* reserved);

/// Registers the natives of MokaDisplay.
MOKA_API void Display_OnLoad(JavaVM* vm);

/// Also creates one MokaBitmapLoader, whose thread becomes the loader's.
MOKA_API void BitmapLoader_OnLoad(JavaVM* vm, JNIEnv* env);

/// From now on files other than "mki" are decoded by MokaBitmapFactory.decodeFile. To be called once, from a
/// native method or a JNI_OnLoad whose class loader knows that class and android.graphics.Bitmap. 1, or 0
/// when either class is missing; no exception stays pending. Without Bitmap files are decoded all the same,
/// and Java's bitmaps are left to the garbage collector instead of being recycled.
MOKA_API int MKBitmapFactory_OnLoad(JavaVM* vm, JNIEnv* env);
}
