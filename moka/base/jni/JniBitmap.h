// JNI_ConvertJavaToBitmap: copies the pixels of an android.graphics.Bitmap to a Bitmap.
// Owner:   the bitmap owns its buffer (stride width * 4), and keeps no reference to Java objects.
// Thread:  the thread of env.
// Fails:   logs an error with the reason and returns false. bitmap does not change, and no Java exception is
//          left pending, not even one from before the call.
// Cost:    one buffer of the Java bitmap's size; a second pass only if its rows are padded.
#pragma once

#include "moka/base/Export.h"

#include <jni.h>

namespace Moka {

class Bitmap;

// bitmap must not have pixels. The Java bitmap must have the configuration ARGB_8888, whose bytes are R, G,
// B, A. The bytes are copied unchanged; in Java they are premultiplied by default. The limits are those of
// BitmapFactory. With recycleAfter the Java bitmap is recycled after the conversion; if that fails, it is
// logged, and the conversion still succeeds. No local reference is left.
MOKA_API bool JNI_ConvertJavaToBitmap(JNIEnv* env, jobject javaBitmap, Bitmap* bitmap, bool recycleAfter);

} // namespace Moka
