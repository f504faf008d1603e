#include "moka/base/jni/JniBitmap.h"
#include "moka/base/Bitmap.h"
#include "moka/base/log/AndroidLog.h"
#include "tests/jvm/JavaFixture.h"
#include "tests/support/Allocation.h"
#include "tests/support/LogCapture.h"

#include <gmock/gmock.h>
#include <string>

namespace Moka::Testing {
namespace {

using testing::HasSubstr;
using Source = JavaPicture;

class JniBitmapTest : public JavaFixture {
protected:
    Bytes Convert(Source const& source) {
        Bitmap bitmap;
        jobject const javaBitmap = MakeJavaBitmap(source);
        EXPECT_TRUE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, false));
        EXPECT_EQ(GetRecycled(javaBitmap), 0);
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
        jobject const javaBitmap = MakeJavaBitmap(source);
        ExpectRefusal(javaBitmap, reason);
        EXPECT_EQ(GetRecycled(javaBitmap), 0);
        mEnv->DeleteLocalRef(javaBitmap);
    }
};

TEST_F(JniBitmapTest, PixelsComeOverBitForBitAndRowsLoseTheirPadding) {
    // Every byte, so also colours that no premultiplied pixel has: nothing may be computed on the way.
    // Padding of less than a row, of more than a row, and of a size that is no whole pixel.
    for (int rowBytes : {64, 68, 67, 260}) {
        Source source;
        source.width = 16;
        source.height = 16;
        source.rowBytes = rowBytes;
        source.pixels.assign(static_cast<std::size_t>(rowBytes) * 16, 0xee);
        Bytes expected(16 * 64);
        for (std::size_t i = 0; i < expected.size(); ++i) {
            expected[i] = static_cast<unsigned char>(i + i / 256);
            source.pixels[i / 64 * static_cast<std::size_t>(rowBytes) + i % 64] = expected[i];
        }
        EXPECT_EQ(Convert(source), expected) << rowBytes;
    }
}

TEST_F(JniBitmapTest, RecyclesOnRequestAndKeepsThePixelsWhateverComesOfIt) {
    for (char const* failing : {"", "recycle"}) {
        Source source;
        source.failing = failing;
        jobject const javaBitmap = MakeJavaBitmap(source);
        Bitmap bitmap;
        LogCapture log;
        EXPECT_TRUE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, true));
        EXPECT_NE(bitmap.GetBuffer(), nullptr);
        bool const fails = *failing != '\0';
        EXPECT_EQ(GetRecycled(javaBitmap), fails ? 0 : 1);
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
    ExpectRefusal(MakeObject("java/lang/Object"), "getConfig: java.lang.NoSuchMethodError");
    ExpectRefusal(MakeObject("android/graphics/Bitmap$WithoutCopy"),
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
    NoArrayMemory const noMemory; // an allocation would be refused for another reason
    for (auto const& [width, height, rowBytes, reason] : cases) {
        ExpectRefusal({width, height, rowBytes, "ARGB_8888", {}, nullptr}, reason);
    }
}

TEST_F(JniBitmapTest, PixelsAreAllocatedOnceAndNeverLeaked) {
    Source padded;
    padded.rowBytes = 8;
    padded.pixels.assign(8, 1);
    jobject const good = MakeJavaBitmap(padded);
    std::size_t const before = ArrayMemory::GetLive();
    {
        Bitmap bitmap;
        ASSERT_TRUE(JNI_ConvertJavaToBitmap(mEnv, good, &bitmap, false));
        EXPECT_EQ(ArrayMemory::GetLive(), before + 8);
    }
    padded.failing = "copyPixelsToBuffer";
    ExpectRefusal(padded, "copyPixelsToBuffer");
    EXPECT_EQ(ArrayMemory::GetLive(), before);
    NoArrayMemory const noMemory;
    ExpectRefusal(good, "out of memory");
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
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(&full, MakeJavaBitmap(), &bitmap, false));
    EXPECT_FALSE(isPending);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "no room for local references"), 1);
}

TEST_F(JniBitmapTest, ReportsWhatIsThrownAndLeavesNothingPending) {
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
    jobject const javaBitmap = MakeJavaBitmap();
    mEnv->ThrowNew(mEnv->FindClass("java/lang/RuntimeException"), "earlier");
    ExpectRefusal(javaBitmap, "pending before the call: java.lang.RuntimeException: earlier");
}

TEST_F(JniBitmapTest, RefusesABitmapThatCannotBeFilledAndLeavesIt) {
    jobject const javaBitmap = MakeJavaBitmap();
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

TEST_F(JniBitmapTest, NoLocalReferenceIsLeftBehind) {
    LogCapture const quiet;
    Source failing;
    failing.failing = "copyPixelsToBuffer";
    jobject const good = MakeJavaBitmap();
    for (jobject javaBitmap : {good, MakeJavaBitmap(failing), jobject{}})
        ExpectNoReferencesLeft([&] {
            Bitmap bitmap;
            ASSERT_EQ(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, true), javaBitmap == good);
        });
}

} // namespace
} // namespace Moka::Testing
