// JNI_ConvertJavaToBitmap: the pixels of an android.graphics.Bitmap as a Bitmap.
// Owner:   the pixels are copied: the bitmap owns its buffer (stride width * 4), and keeps nothing of Java's.
// Thread:  one that env belongs to.
// Fails:   false and one error line that gives the reason; bitmap is untouched and no Java exception is left
//          pending, not even one that was before.
// Cost:    one buffer of the Java bitmap's size; a second pass only when its rows are padded.
#pragma once

#include "moka/base/Export.h"

#include <jni.h>

namespace Moka {

class Bitmap;

// bitmap has no pixels yet. The Java bitmap must be of the configuration ARGB_8888, whose bytes lie R, G, B,
// A; they come over bit for bit: premultiplied, as Java keeps them unless the bitmap's owner asked otherwise.
// The limits are BitmapFactory's. recycleAfter: recycles the Java bitmap once it is converted; a recycling
// that fails is logged and takes nothing back. No local reference is left behind.
MOKA_API bool JNI_ConvertJavaToBitmap(JNIEnv* env, jobject javaBitmap, Bitmap* bitmap, bool recycleAfter);

} // namespace Moka
