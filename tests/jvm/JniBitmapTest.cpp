#include "moka/base/jni/JniBitmap.h"
#include "moka/base/Bitmap.h"
#include "moka/base/log/AndroidLog.h"
#include "tests/jvm/JavaFixture.h"
#include "tests/jvm/PatchedFunctions.h"
#include "tests/support/Allocation.h"
#include "tests/support/LogCapture.h"

#include <gmock/gmock.h>
#include <string>

namespace Moka::Testing {
namespace {

using testing::HasSubstr;

class JniBitmapTest : public JavaFixture {
protected:
    // Refused, with one error line that says reason, and nothing taken or left pending.
    void ExpectRefusal(jobject javaBitmap, std::string const& reason) {
        SCOPED_TRACE(reason);
        Bitmap bitmap;
        LogCapture log;
        EXPECT_FALSE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, true));
        EXPECT_FALSE(mEnv->ExceptionCheck());
        EXPECT_EQ(bitmap.GetBuffer(), nullptr);
        EXPECT_THAT(log.GetTexts(), testing::ElementsAre(HasSubstr(reason)));
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 1);
    }
    void ExpectRefusal(JavaPicture const& source, std::string const& reason) {
        jobject const javaBitmap = MakeJavaBitmap(source);
        ExpectRefusal(javaBitmap, reason);
        EXPECT_EQ(GetRecycled(javaBitmap), 0);
        mEnv->DeleteLocalRef(javaBitmap);
    }
};

TEST_F(JniBitmapTest, PixelsComeOverBitForBitAndRowsLoseTheirPadding) {
    // Every byte, so also colours that no premultiplied pixel has: nothing may be computed on the way.
    // Padding of less than a row, of more than a row, and of a size that is no whole pixel.
    for (int const rowBytes : {64, 68, 67, 260}) {
        JavaPicture source{
            16, 16, rowBytes, "ARGB_8888", Bytes(static_cast<std::size_t>(rowBytes) * 16, 0xee), ""};
        Bytes expected(16 * 64);
        for (std::size_t i = 0; i < expected.size(); ++i) {
            expected[i] = static_cast<unsigned char>(i + i / 256);
            source.pixels[i / 64 * static_cast<std::size_t>(rowBytes) + i % 64] = expected[i];
        }
        jobject const javaBitmap = MakeJavaBitmap(source);
        std::size_t const before = ArrayMemory::GetLive();
        Bitmap bitmap;
        ASSERT_TRUE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, false));
        EXPECT_EQ(ArrayMemory::GetLive(), before + static_cast<std::size_t>(rowBytes) * 16);
        EXPECT_EQ(GetRecycled(javaBitmap), 0);
        EXPECT_EQ(
            std::vector({bitmap.GetWidth(), bitmap.GetHeight(), bitmap.GetStride(), bitmap.GetFormat()}),
            std::vector({16, 16, 64, int{Bitmap::kFormatRgba8888}}));
        EXPECT_EQ(Bytes(bitmap.GetBuffer(), bitmap.GetBuffer() + expected.size()), expected) << rowBytes;
    }
}

TEST_F(JniBitmapTest, RecyclesOnRequestAndKeepsThePixelsWhateverComesOfIt) {
    for (int const isWell : {0, 1}) {
        jobject const javaBitmap =
            MakeJavaBitmap({1, 1, 4, "ARGB_8888", {1, 2, 3, 4}, isWell ? "" : "recycle"});
        Bitmap bitmap;
        LogCapture log;
        EXPECT_TRUE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &bitmap, true));
        EXPECT_NE(bitmap.GetBuffer(), nullptr);
        EXPECT_EQ(GetRecycled(javaBitmap), isWell);
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "recycle: java.lang.IllegalStateException"), 1 - isWell);
        EXPECT_EQ(log.GetTexts().size(), 1u - static_cast<unsigned>(isWell));
    }
}

TEST_F(JniBitmapTest, RefusesWhatIsNoBitmapOfItsKindOrSizeBeforeAllocatingAnything) {
    struct {
        int width, height, rowBytes;
        char const* config;
        std::string reason;
    } const cases[] = {
        {1, 1, 4, "ALPHA_8", "configuration is ALPHA_8, ARGB_8888 is needed"},
        {1, 1, 4, "RGBA_F16", "configuration is RGBA_F16, ARGB_8888 is needed"},
        {1, 1, 4, nullptr, "no configuration, ARGB_8888 is needed"},
        {0, 1, 4, "ARGB_8888", "0 x 1 pixels"},
        {1, -1, 4, "ARGB_8888", "1 x -1 pixels"},
        {65536, 1, 65536 * 4, "ARGB_8888", "65536 x 1 pixels"},
        {1, 65536, 4, "ARGB_8888", "1 x 65536 pixels"},
        {2, 1, 7, "ARGB_8888", "7 bytes a row"},
        {1, 1, -4, "ARGB_8888", "-4 bytes a row"},
        {65535, 65535, 65535 * 4, "ARGB_8888", "65535 x 65535 pixels"},
        {1, 65535, 16385, "ARGB_8888", "16385 bytes a row"}, // just over 1 GiB, in the padding
        {1, 2, 0x7fffffff, "ARGB_8888", "2147483647 bytes a row"},
    };
    NoArrayMemory const noMemory; // an allocation would be refused for another reason
    for (auto const& [width, height, rowBytes, config, reason] : cases)
        ExpectRefusal({width, height, rowBytes, config, {}, nullptr}, reason);
    ExpectRefusal(jobject{}, "there is no Java bitmap");
    ExpectRefusal(mEnv->AllocObject(mEnv->FindClass("java/lang/Object")),
                  "getConfig: java.lang.NoSuchMethodError");
    ExpectRefusal(JavaPicture(), "out of memory");
}

TEST_F(JniBitmapTest, ReportsWhatIsThrownAndLeavesNothingPending) {
    std::size_t const before = ArrayMemory::GetLive();
    for (std::string const method :
         {"getWidth", "getHeight", "getConfig", "getRowBytes", "copyPixelsToBuffer"}) {
        JavaPicture source;
        source.failing = method.c_str();
        ExpectRefusal(source, method + ": java.lang.IllegalStateException: " + method + " was told to");
        std::string const mute = "mute " + method;
        source.failing = mute.c_str();
        ExpectRefusal(source, method + ": an exception that cannot be described");
    }
    {
        PatchedFunctions const missing(mEnv, "copyPixelsToBuffer");
        ExpectRefusal(JavaPicture(), "copyPixelsToBuffer: java.lang.NoSuchMethodError");
    }
    // A bitmap that has more than it said; what Java wrote before it noticed is dropped.
    ExpectRefusal({1, 1, 4, "ARGB_8888", {1, 2, 3, 4, 5}, nullptr}, "java.nio.BufferOverflowException");
    jobject const javaBitmap = MakeJavaBitmap();
    mEnv->ThrowNew(mEnv->FindClass("java/lang/RuntimeException"), "earlier");
    ExpectRefusal(javaBitmap, "pending before the call: java.lang.RuntimeException: earlier");
    EXPECT_EQ(ArrayMemory::GetLive(), before);
}

TEST_F(JniBitmapTest, RefusesWhatItCannotFillAndLeavesIt) {
    jobject const javaBitmap = MakeJavaBitmap();
    unsigned char own[4] = {9, 9, 9, 9};
    Bitmap empty, full;
    ASSERT_TRUE(full.Construct(own, 1, 1, 4, Bitmap::kFormatRgba8888, false, false));
    LogCapture log;
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, nullptr, false));
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &full, false));
    EXPECT_EQ(full.GetBuffer(), own);
    EXPECT_FALSE(JNI_ConvertJavaToBitmap(nullptr, javaBitmap, &empty, false));
    {
        PatchedFunctions crowded(mEnv);
        crowded->PushLocalFrame = [](JNIEnv*, jint) -> jint { return JNI_ENOMEM; };
        EXPECT_FALSE(JNI_ConvertJavaToBitmap(mEnv, javaBitmap, &empty, false));
    }
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR),
                testing::ElementsAre(HasSubstr("there is no bitmap to fill"), HasSubstr("has pixels already"),
                                     HasSubstr("the thread has no JNIEnv"),
                                     HasSubstr("no room for local references")));
}

} // namespace
} // namespace Moka::Testing
