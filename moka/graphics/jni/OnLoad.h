/// OnLoad.h: the entry points for Java. When Java loads the library it calls JNI_OnLoad, which registers the
/// native methods of MokaDisplay and MokaBitmapLoader. The library does not call MKBitmapFactory_OnLoad; the
/// host does.
/// Thread: the thread that loads the library, before any other use of it.
/// Fails:  logs missing classes and methods. JNI_OnLoad and the two functions that it calls leave Java's
///         exception pending, so System.loadLibrary throws it.
#pragma once

#include "moka/base/Export.h"

#include <jni.h>

extern "C" {

/// Returns the required version of JNI, or 0, which Java treats as a failure.
JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void* reserved);

/// Registers the native methods of MokaDisplay.
MOKA_API void Display_OnLoad(JavaVM* vm);

/// Registers the native methods of MokaBitmapLoader, and creates one such object, whose thread becomes the
/// loader's.
MOKA_API void BitmapLoader_OnLoad(JavaVM* vm, JNIEnv* env);

/// Makes MokaBitmapFactory.decodeFile decode all files other than "mki". Call it once, from a native method
/// or a JNI_OnLoad whose class loader finds that class and android.graphics.Bitmap. Returns 1, or 0 if one of
/// the classes is missing. No exception stays pending. If only Bitmap is missing, files are decoded
/// nevertheless, and Java's bitmaps are not recycled but left to the garbage collector.
MOKA_API int MKBitmapFactory_OnLoad(JavaVM* vm, JNIEnv* env);
}
