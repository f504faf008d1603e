#include "moka/base/jni/JniBitmap.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/NonAssignable.h"
#include "moka/base/log/AndroidLog.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <new>

namespace Moka {
namespace {

// More local references than a conversion creates, including the description of an exception.
constexpr jint kLocalReferences = 24;

bool Refuse(char const* reason) {
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "JNI_ConvertJavaToBitmap: %s", reason);
    return false;
}

class LocalFrame : NonAssignable {
public:
    explicit LocalFrame(JNIEnv* env)
        : mEnv(env), mIsPushed(env->PushLocalFrame(kLocalReferences) == JNI_OK) {}
    ~LocalFrame() {
        if (mIsPushed) mEnv->PopLocalFrame(nullptr);
    }
    bool IsPushed() const { return mIsPushed; }

private:
    JNIEnv* const mEnv;
    bool const mIsPushed;
};

// The beginning of a Java string, in modified UTF-8.
struct Text {
    static constexpr jsize kUnits = 200;
    char bytes[kUnits * 3 + 1] = {};

    void Read(JNIEnv* env, jstring string) {
        env->GetStringUTFRegion(string, 0, std::min(env->GetStringLength(string), kUnits), bytes);
    }
};

void Describe(JNIEnv* env, jthrowable thrown, Text* text) {
    std::strcpy(text->bytes, "an exception that cannot be described");
    jmethodID const toString =
        env->GetMethodID(env->GetObjectClass(thrown), "toString", "()Ljava/lang/String;");
    jobject const string = toString ? env->CallObjectMethod(thrown, toString) : nullptr;
    if (env->ExceptionCheck()) return env->ExceptionClear();
    if (!string) return;
    *text = {};
    text->Read(env, static_cast<jstring>(string));
}

// Clears and logs the pending exception of a call. Returns false if there is none.
bool LogException(JNIEnv* env, char const* call) {
    jthrowable const thrown = env->ExceptionOccurred();
    if (!thrown) return false;
    env->ExceptionClear();
    Text text;
    Describe(env, thrown, &text);
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "JNI_ConvertJavaToBitmap: %s: %s", call, text.bytes);
    return true;
}

// If the object has no such method, logs an error and returns null. Uses the object's class, because the
// class loader of a native thread may not find it.
jmethodID FindMethod(JNIEnv* env, jobject object, char const* name, char const* signature) {
    jmethodID const method = env->GetMethodID(env->GetObjectClass(object), name, signature);
    return LogException(env, name) ? nullptr : method;
}

bool CallInt(JNIEnv* env, jobject object, char const* name, int* result) {
    jmethodID const method = FindMethod(env, object, name, "()I");
    if (!method) return false;
    *result = env->CallIntMethod(object, method);
    return !LogException(env, name);
}

bool CallObject(JNIEnv* env, jobject object, char const* name, char const* signature, jobject* result) {
    jmethodID const method = FindMethod(env, object, name, signature);
    if (!method) return false;
    *result = env->CallObjectMethod(object, method);
    return !LogException(env, name);
}

bool CheckConfig(JNIEnv* env, jobject javaBitmap) {
    jobject config = nullptr;
    if (!CallObject(env, javaBitmap, "getConfig", "()Landroid/graphics/Bitmap$Config;", &config))
        return false;
    if (!config) return Refuse("the bitmap has no configuration, ARGB_8888 is needed");
    jobject name = nullptr;
    if (!CallObject(env, config, "name", "()Ljava/lang/String;", &name)) return false;
    Text text;
    text.Read(env, static_cast<jstring>(name));
    if (std::strcmp(text.bytes, "ARGB_8888") == 0) return true;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "JNI_ConvertJavaToBitmap: the bitmap's configuration is %s, ARGB_8888 is needed",
                        text.bytes);
    return false;
}

struct Layout {
    int width = 0;
    int height = 0;
    int rowBytes = 0;

    std::size_t GetSize() const {
        return static_cast<std::size_t>(rowBytes) * static_cast<std::size_t>(height);
    }
    bool IsWithinLimits() const {
        int const shorter = std::min(width, height);
        int const longer = std::max(width, height);
        return shorter >= 1 && longer <= BitmapFactory::kMaxSide && rowBytes / 4 >= width &&
               std::uint64_t{GetSize()} <= BitmapFactory::kMaxBytes;
    }
};

bool ReadLayout(JNIEnv* env, jobject javaBitmap, Layout* layout) {
    if (!CallInt(env, javaBitmap, "getWidth", &layout->width)) return false;
    if (!CallInt(env, javaBitmap, "getHeight", &layout->height)) return false;
    if (!CallInt(env, javaBitmap, "getRowBytes", &layout->rowBytes)) return false;
    if (layout->IsWithinLimits()) return true;
    __android_log_print(
        ANDROID_LOG_ERROR, "mok_log",
        "JNI_ConvertJavaToBitmap: %d x %d pixels with %d bytes a row cannot be taken (sides of 1 "
        "to %d, %llu bytes in all)",
        layout->width, layout->height, layout->rowBytes, BitmapFactory::kMaxSide,
        static_cast<unsigned long long>(BitmapFactory::kMaxBytes));
    return false;
}

bool CopyPixels(JNIEnv* env, jobject javaBitmap, unsigned char* pixels, std::size_t size) {
    jobject const buffer = env->NewDirectByteBuffer(pixels, static_cast<jlong>(size));
    if (LogException(env, "NewDirectByteBuffer")) return false;
    if (!buffer) return Refuse("the Java VM has no direct buffers");
    char const* const name = "copyPixelsToBuffer";
    jmethodID const method = FindMethod(env, javaBitmap, name, "(Ljava/nio/Buffer;)V");
    if (!method) return false;
    env->CallVoidMethod(javaBitmap, method, buffer);
    return !LogException(env, name);
}

void RemovePadding(unsigned char* pixels, Layout const& layout) {
    std::size_t const sourceStride = static_cast<std::size_t>(layout.rowBytes);
    std::size_t const stride = static_cast<std::size_t>(layout.width) * 4;
    if (sourceStride == stride) return;
    std::size_t const rows = static_cast<std::size_t>(layout.height);
    // Moves rows forward in place: a row never overwrites the rows after it.
    for (std::size_t row = 1; row < rows; ++row) {
        std::memmove(pixels + row * stride, pixels + row * sourceStride, stride);
    }
}

bool Convert(JNIEnv* env, jobject javaBitmap, Bitmap* bitmap) {
    Layout layout;
    if (!CheckConfig(env, javaBitmap) || !ReadLayout(env, javaBitmap, &layout)) return false;
    std::unique_ptr<unsigned char[]> pixels(new (std::nothrow) unsigned char[layout.GetSize()]);
    if (!pixels) return Refuse("out of memory for the pixels");
    if (!CopyPixels(env, javaBitmap, pixels.get(), layout.GetSize())) return false;
    RemovePadding(pixels.get(), layout);
    if (!bitmap->Construct(pixels.get(), layout.width, layout.height, layout.width * 4,
                           Bitmap::kFormatRgba8888, false, true)) {
        return Refuse("the bitmap to fill refuses the pixels");
    }
    pixels.release();
    return true;
}

void Recycle(JNIEnv* env, jobject javaBitmap) {
    jmethodID const method = FindMethod(env, javaBitmap, "recycle", "()V");
    if (!method) return;
    env->CallVoidMethod(javaBitmap, method);
    LogException(env, "recycle");
}

} // namespace

bool JNI_ConvertJavaToBitmap(JNIEnv* env, jobject javaBitmap, Bitmap* bitmap, bool recycleAfter) {
    if (!env) return Refuse("the thread has no JNIEnv");
    // First of all, because describing an exception creates local references as well.
    LocalFrame const frame(env);
    if (!frame.IsPushed()) {
        env->ExceptionClear();
        return Refuse("no room for local references");
    }
    if (LogException(env, "pending before the call")) return false;
    if (!javaBitmap) return Refuse("there is no Java bitmap");
    if (!bitmap) return Refuse("there is no bitmap to fill");
    if (bitmap->GetBuffer()) return Refuse("the bitmap to fill has pixels already");
    if (!Convert(env, javaBitmap, bitmap)) return false;
    if (recycleAfter) Recycle(env, javaBitmap);
    return true;
}

} // namespace Moka
