#include "moka/base/jni/JniBitmap.h"
#include "moka/base/Bitmap.h"
#include "moka/base/jni/JNIAutoThread.h"
#include "moka/base/log/AndroidLog.h"
#include "tests/jvm/JavaMachine.h"
#include "tests/jvm/PixelMemory.h"
#include "tests/support/LogCapture.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

namespace Moka::Testing {
namespace {

using testing::HasSubstr;
using Bytes = std::vector<unsigned char>;

constexpr unsigned char kOnePixel[] = {1, 2, 3, 4};

struct Source {
    int width = 1;
    int height = 1;
    int rowBytes = 4;
    char const* config = "ARGB_8888";
    Bytes pixels = Bytes(std::begin(kOnePixel), std::end(kOnePixel));
    char const* failing = nullptr;
};

jstring MakeString(JNIEnv* env, char const* text) { return text ? env->NewStringUTF(text) : nullptr; }

// A local reference, in the caller's frame; what it takes to get there is given back.
jobject MakeJavaBitmap(JNIEnv* env, Source const& source) {
    env->PushLocalFrame(16);
    auto const size = static_cast<jsize>(source.pixels.size());
    jbyteArray const pixels = env->NewByteArray(size);
    env->SetByteArrayRegion(pixels, 0, size, reinterpret_cast<jbyte const*>(source.pixels.data()));
    jclass const type = env->FindClass("android/graphics/Bitmap");
    jmethodID const init = env->GetMethodID(type, "<init>", "(IIILjava/lang/String;[BLjava/lang/String;)V");
    jobject const made =
        env->NewObject(type, init, source.width, source.height, source.rowBytes,
                       MakeString(env, source.config), pixels, MakeString(env, source.failing));
    EXPECT_FALSE(env->ExceptionCheck());
    return env->PopLocalFrame(made);
}

jobject MakeObject(JNIEnv* env, char const* className) {
    env->PushLocalFrame(4);
    jclass const type = env->FindClass(className);
    jobject const made = env->NewObject(type, env->GetMethodID(type, "<init>", "()V"));
    EXPECT_FALSE(env->ExceptionCheck());
    return env->PopLocalFrame(made);
}

int GetRecycled(JNIEnv* env, jobject javaBitmap) {
    jclass const type = env->GetObjectClass(javaBitmap);
    int const recycled = env->GetIntField(javaBitmap, env->GetFieldID(type, "recycled", "I"));
    env->DeleteLocalRef(type);
    return recycled;
}

void CollectGarbage(JNIEnv* env) {
    jclass const type = env->FindClass("java/lang/System");
    env->CallStaticVoidMethod(type, env->GetStaticMethodID(type, "gc", "()V"));
    EXPECT_FALSE(env->ExceptionCheck());
    env->DeleteLocalRef(type);
}

// Each case in a frame of its own, and no case may make the VM's JNI checks speak.
class JniBitmapTest : public testing::Test {
protected:
    void SetUp() override {
        JavaMachine::TakeOutput();
        ASSERT_EQ(mEnv->PushLocalFrame(16), JNI_OK);
    }
    void TearDown() override {
        EXPECT_FALSE(mEnv->ExceptionCheck());
        mEnv->PopLocalFrame(nullptr);
        EXPECT_EQ(JavaMachine::TakeOutput(), "");
    }

    Bytes Convert(Source const& source) {
        Bitmap bitmap;
        jobject const javaBitmap = MakeJavaBitmap(mEnv, source);
        EXPECT_TRUE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, false));
        EXPECT_EQ(GetRecycled(mEnv, javaBitmap), 0);
        EXPECT_EQ(bitmap.GetWidth(), source.width);
        EXPECT_EQ(bitmap.GetHeight(), source.height);
        EXPECT_EQ(bitmap.GetStride(), source.width * 4);
        EXPECT_EQ(bitmap.GetFormat(), Bitmap::kFormatRgba8888);
        EXPECT_TRUE(bitmap.GetDeleteBuffer());
        if (!bitmap.GetBuffer()) return {};
        return Bytes(bitmap.GetBuffer(), bitmap.GetBuffer() + bitmap.GetStride() * bitmap.GetHeight());
    }

    // Refused, with one error line that says reason, and nothing taken or left pending.
    void ExpectRefusal(jobject javaBitmap, char const* reason) {
        SCOPED_TRACE(reason);
        Bitmap bitmap;
        LogCapture log;
        EXPECT_FALSE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, true));
        EXPECT_FALSE(mEnv->ExceptionCheck());
        EXPECT_EQ(bitmap.GetBuffer(), nullptr);
        ASSERT_EQ(log.GetLines().size(), 1u);
        EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), testing::ElementsAre(HasSubstr(reason)));
    }
    void ExpectRefusal(Source const& source, char const* reason) {
        jobject const javaBitmap = MakeJavaBitmap(mEnv, source);
        ExpectRefusal(javaBitmap, reason);
        EXPECT_EQ(GetRecycled(mEnv, javaBitmap), 0);
        mEnv->DeleteLocalRef(javaBitmap);
    }

    JNIEnv* const mEnv = JavaMachine::GetMainEnv();
};

TEST_F(JniBitmapTest, PixelsComeOverBitForBit) {
    // Every value of alpha, and colours that no premultiplied pixel has: nothing may be computed on the way.
    Source source;
    source.width = 16;
    source.height = 16;
    source.rowBytes = 64;
    source.pixels.clear();
    for (int alpha = 0; alpha < 256; ++alpha) {
        for (int value : {alpha / 2, alpha, 255 - alpha, alpha}) {
            source.pixels.push_back(static_cast<unsigned char>(value));
        }
    }
    EXPECT_EQ(Convert(source), source.pixels);
}

TEST_F(JniBitmapTest, RowsLoseTheirPadding) {
    // Padding of less than a row, of more than a row, and of a size that is no whole pixel.
    for (int rowBytes : {12, 15, 100}) {
        Source source;
        source.width = 2;
        source.height = 3;
        source.rowBytes = rowBytes;
        source.pixels.assign(static_cast<std::size_t>(rowBytes) * 3, 0xee);
        Bytes expected(2 * 3 * 4);
        for (std::size_t i = 0; i < expected.size(); ++i) {
            expected[i] = static_cast<unsigned char>(i + 1);
            source.pixels[i / 8 * static_cast<std::size_t>(rowBytes) + i % 8] = expected[i];
        }
        EXPECT_EQ(Convert(source), expected) << rowBytes;
    }
}

TEST_F(JniBitmapTest, ANativeThreadConverts) {
    auto const shared = mEnv->NewGlobalRef(MakeJavaBitmap(mEnv, {}));
    std::thread([shared] {
        JNIAutoThread const thread(JavaMachine::GetVm());
        Bitmap bitmap;
        ASSERT_TRUE(JNI_ConvertJavaToBitmap(thread.GetEnv(), shared, &bitmap, false));
        EXPECT_EQ(Bytes(bitmap.GetBuffer(), bitmap.GetBuffer() + 4), (Bytes{1, 2, 3, 4}));
    }).join();
    mEnv->DeleteGlobalRef(shared);
}

TEST_F(JniBitmapTest, RecyclesOnRequestAndKeepsThePixelsWhateverComesOfIt) {
    for (char const* failing : {"", "recycle"}) {
        Source source;
        source.failing = failing;
        jobject const javaBitmap = MakeJavaBitmap(mEnv, source);
        Bitmap bitmap;
        LogCapture log;
        EXPECT_TRUE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, true));
        EXPECT_NE(bitmap.GetBuffer(), nullptr);
        bool const fails = *failing != '\0';
        EXPECT_EQ(GetRecycled(mEnv, javaBitmap), fails ? 0 : 1);
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "recycle: java.lang.IllegalStateException"), fails ? 1 : 0);
        EXPECT_EQ(log.GetLines().size(), fails ? 1u : 0u);
    }
}

TEST_F(JniBitmapTest, RefusesWhatIsNotAnArgb8888Bitmap) {
    ExpectRefusal(jobject{}, "there is no Java bitmap");
    for (char const* config : {"ALPHA_8", "RGB_565", "ARGB_4444", "RGBA_F16", "HARDWARE"}) {
        Source source;
        source.config = config;
        ExpectRefusal(source, (std::string("configuration is ") + config + ", ARGB_8888 is needed").c_str());
    }
    Source none;
    none.config = nullptr;
    ExpectRefusal(none, "no configuration, ARGB_8888 is needed");
    ExpectRefusal(MakeObject(mEnv, "java/lang/Object"), "getConfig: java.lang.NoSuchMethodError");
    ExpectRefusal(MakeObject(mEnv, "android/graphics/Bitmap$WithoutCopy"),
                  "copyPixelsToBuffer: java.lang.NoSuchMethodError");
}

TEST_F(JniBitmapTest, RefusesSizesOutsideTheLimitsBeforeAllocatingAnything) {
    struct {
        int width, height, rowBytes;
        char const* reason;
    } const cases[] = {
        {0, 1, 4, "0 x 1 pixels"},
        {1, -1, 4, "1 x -1 pixels"},
        {65536, 1, 65536 * 4, "65536 x 1 pixels"},
        {1, 65536, 4, "1 x 65536 pixels"},
        {2, 1, 7, "7 bytes a row"},
        {1, 1, -4, "-4 bytes a row"},
        {65535, 65535, 65535 * 4, "65535 x 65535 pixels"},
        {1, 65535, 16385, "16385 bytes a row"}, // just over 1 GiB, in the padding
        {1, 2, 0x7fffffff, "2147483647 bytes a row"},
    };
    NoPixelMemory const noMemory; // an allocation would be refused for another reason
    for (auto const& [width, height, rowBytes, reason] : cases) {
        ExpectRefusal({width, height, rowBytes, "ARGB_8888", {}, nullptr}, reason);
    }
}

TEST_F(JniBitmapTest, RefusesWhenThereIsNoMemoryForThePixels) {
    NoPixelMemory const noMemory;
    ExpectRefusal(Source{}, "out of memory");
}

TEST_F(JniBitmapTest, RefusesWhenThereIsNoRoomForLocalReferences) {
    JNINativeInterface_ functions = {};
    static bool isPending;
    isPending = true;
    functions.ExceptionClear = [](JNIEnv*) { isPending = false; };
    functions.PushLocalFrame = [](JNIEnv*, jint) -> jint { return JNI_ENOMEM; };
    JNIEnv full = {};
    full.functions = &functions;
    Bitmap bitmap;
    LogCapture log;
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(&full, MakeJavaBitmap(mEnv, {}), &bitmap, false));
    EXPECT_FALSE(isPending);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "no room for local references"), 1);
}

TEST_F(JniBitmapTest, ReportsWhatEachMethodThrowsAndLeavesNothingPending) {
    for (std::string method : {"getWidth", "getHeight", "getConfig", "getRowBytes", "copyPixelsToBuffer"}) {
        Source source;
        source.failing = method.c_str();
        std::string const told = method + ": java.lang.IllegalStateException: " + method + " was told to";
        ExpectRefusal(source, told.c_str());
        std::string const mute = "mute " + method;
        source.failing = mute.c_str();
        ExpectRefusal(source, (method + ": an exception that cannot be described").c_str());
    }
    // A bitmap that has more than it said; what Java wrote before it noticed is dropped.
    ExpectRefusal({1, 1, 4, "ARGB_8888", {1, 2, 3, 4, 5}, nullptr}, "java.nio.BufferOverflowException");
}

TEST_F(JniBitmapTest, RefusesAnExceptionThatWasPendingBefore) {
    jobject const javaBitmap = MakeJavaBitmap(mEnv, {});
    mEnv->ThrowNew(mEnv->FindClass("java/lang/RuntimeException"), "earlier");
    ExpectRefusal(javaBitmap, "pending before the call: java.lang.RuntimeException: earlier");
}

TEST_F(JniBitmapTest, RefusesABitmapThatCannotBeFilledAndLeavesIt) {
    jobject const javaBitmap = MakeJavaBitmap(mEnv, {});
    LogCapture log;
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, nullptr, false));
    unsigned char own[4] = {9, 9, 9, 9};
    Bitmap full;
    ASSERT_TRUE(full.Construct(own, 1, 1, 4, Bitmap::kFormatRgba8888, false, false));
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &full, false));
    EXPECT_EQ(full.GetBuffer(), own);
    Bitmap bitmap;
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(nullptr, javaBitmap, &bitmap, false));
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR),
                testing::ElementsAre(HasSubstr("there is no bitmap to fill"), HasSubstr("has pixels already"),
                                     HasSubstr("the thread has no JNIEnv")));
}

TEST_F(JniBitmapTest, PixelsAreAllocatedOnceAndNeverLeaked) {
    Source padded;
    padded.rowBytes = 8;
    padded.pixels.assign(8, 1);
    jobject const good = MakeJavaBitmap(mEnv, padded);
    int const before = GetLiveArrays();
    {
        Bitmap bitmap;
        ASSERT_TRUE(JNI_ConvertJavaToBitmap(mEnv, good, &bitmap, false));
        EXPECT_EQ(GetLiveArrays(), before + 1);
    }
    EXPECT_EQ(GetLiveArrays(), before);
    padded.failing = "copyPixelsToBuffer";
    ExpectRefusal(padded, "copyPixelsToBuffer");
    EXPECT_EQ(GetLiveArrays(), before);
}

TEST_F(JniBitmapTest, NoLocalReferenceIsLeftBehind) {
    LogCapture const quiet;
    Source failing;
    failing.failing = "copyPixelsToBuffer";
    jobject const good = MakeJavaBitmap(mEnv, {});
    jobject const bad = MakeJavaBitmap(mEnv, failing);
    for (jobject javaBitmap : {good, bad, jobject{}}) {
        // The frame on top afterwards is the one that was before: with it goes what only it holds.
        ASSERT_EQ(mEnv->PushLocalFrame(4), JNI_OK);
        jweak const ours = mEnv->NewWeakGlobalRef(MakeObject(mEnv, "java/lang/Object"));
        Bitmap bitmap;
        EXPECT_EQ(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, true), javaBitmap == good);
        mEnv->PopLocalFrame(nullptr);
        CollectGarbage(mEnv);
        EXPECT_TRUE(mEnv->IsSameObject(ours, nullptr));
        mEnv->DeleteWeakGlobalRef(ours);
    }
    // And what would gather outside of the conversion's own frame, the VM's checks report when the case ends.
    for (int i = 0; i < 1000; ++i) {
        Bitmap bitmap;
        ASSERT_TRUE(JNI_ConvertJavaToBitmap(mEnv, good, &bitmap, true));
        ASSERT_FALSE(JNI_ConvertJavaToBitmap(mEnv, bad, &bitmap, true));
    }
}

} // namespace
} // namespace Moka::Testing
