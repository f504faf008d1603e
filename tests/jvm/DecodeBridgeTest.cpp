// Files decoded through Java: a Java factory that does what the test tells it, and Java bitmaps that fail
// where they are told to.
#include "moka/base/Bitmap.h"
#include "moka/base/String.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/jni/OnLoad.h"
#include "tests/jvm/JavaFixture.h"
#include "tests/jvm/PatchedFunctions.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"

#include <gmock/gmock.h>
#include <memory>
#include <string>
#include <thread>
#include <vector>

namespace Moka::Testing {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using BitmapOwner = std::unique_ptr<Bitmap>;

constexpr char const* kFactory = "com/velmora/android/sdk/pen/graphics/MokaBitmapFactory";
constexpr char const* kBitmap = "android/graphics/Bitmap";
constexpr char const* kBitmapType = "Landroid/graphics/Bitmap;";
constexpr char const* kNotLoaded = "MKBitmapFactory : gDecodeFile Not loaded";

Bytes const kPixels{10, 20, 30, 40, 0, 255, 1, 254}; // two, one over the other

class DecodeBridge : public JavaFixture {
protected:
    void SetUp() override {
        JavaFixture::SetUp();
        mFactory = mEnv->FindClass(kFactory);
        SetResult(nullptr);
        SetThrowing(false);
        LogCapture const quiet;
        ASSERT_EQ(LoadWithout("nothing"), 1);
    }

    // Loads the bridge where one name is missing.
    int LoadWithout(char const* name) {
        PatchedFunctions const missing(mEnv, name);
        return MKBitmapFactory_OnLoad(JavaMachine::GetVm(), mEnv);
    }
    void SetResult(jobject javaBitmap) {
        jfieldID const field = mEnv->GetStaticFieldID(mFactory, "result", kBitmapType);
        mEnv->SetStaticObjectField(mFactory, field, javaBitmap);
    }
    void SetThrowing(bool on) {
        mEnv->SetStaticBooleanField(mFactory, mEnv->GetStaticFieldID(mFactory, "isThrowing", "Z"), on);
    }

    jobject MakeJavaBitmap(char const* config, char const* failing) const {
        return JavaFixture::MakeJavaBitmap({1, 2, 4, config, kPixels, failing});
    }

    TempFolder const mFolder;
    jclass mFactory = nullptr;
};

TEST_F(DecodeBridge, SaysWhatIsMissingAndGoesOnWithWhatIsThere) {
    constexpr char const* kEnter = "MKBitmapFactory JNI_OnLoad enter!!";
    constexpr char const* kSuccess = "MKBitmapFactory JNI_OnLoad Success";
    String const path("/a.png");
    struct {
        char const* hidden;
        char const* message;
        int result;
        bool isDecoding;
        int recycled;
    } const cases[] = {
        {"decodeFile", "MKBitmapFactory Cannot find 'gDecodeFile' method id", 1, false, 0},
        {kBitmap, "MKBitmapFactory Cannot find Bitmap Class", 0, true, 0},
        {"recycle", "MKBitmapFactory Cannot find 'gRecycle' method id", 1, true, 0},
        {"nothing", nullptr, 1, true, 1},
    };
    for (auto const& [name, message, result, isDecoding, recycled] : cases) {
        SCOPED_TRACE(name);
        jobject const javaBitmap = MakeJavaBitmap("ARGB_8888", "");
        SetResult(javaBitmap);
        LogCapture log;
        EXPECT_EQ(LoadWithout(name), result);
        EXPECT_FALSE(mEnv->ExceptionCheck());
        std::vector<std::string> expected{kEnter};
        if (message) expected.push_back(message);
        if (result == 1) expected.push_back(kSuccess);
        EXPECT_EQ(log.GetTexts(), expected);
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), message ? 1 : 0);
        BitmapOwner bitmap; // decoded on a thread that is attached for the call only, or the VM would not end
        std::thread([&] { bitmap.reset(CreateBitmapJNI(&path, 0, 0)); }).join();
        ASSERT_EQ(bitmap != nullptr, isDecoding);
        if (bitmap) {
            EXPECT_EQ(Bytes(bitmap->GetBuffer(), bitmap->GetBuffer() + 8), kPixels);
        }
        EXPECT_EQ(log.Has(kNotLoaded), !isDecoding);
        // Where the class is not looked into, an earlier case's method is still known.
        if (result == 1) {
            EXPECT_EQ(GetRecycled(javaBitmap), recycled);
        }
    }
    LogCapture log;
    EXPECT_EQ(LoadWithout(kFactory), 0);
    EXPECT_THAT(log.GetTexts(), ElementsAre(kEnter, "MKBitmapFactory Cannot find MokaBitmapFactory Class"));
}

TEST_F(DecodeBridge, WhatJavaCannotReadTheBaseLibraryReads) {
    String const good(mFolder.Path("bridge.webp"));
    ASSERT_TRUE(SaveImage(MakeGradient(3, 2), mFolder.Path("bridge.webp")));
    String const bad("/no/such.png");
    for (bool isThrowing : {false, true}) {
        SetThrowing(isThrowing);
        LogCapture log;
        BitmapOwner const bitmap(CreateBitmapJNI(&good, 9, 9));
        ASSERT_TRUE(bitmap);
        EXPECT_EQ(bitmap->GetWidth(), 3) << "at the file's own size";
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "decodeFile threw"), isThrowing ? 1 : 0);
        EXPECT_EQ(CreateBitmapJNI(&bad, 0, 0), nullptr);
    }
    SetThrowing(false);
    String const empty;
    LogCapture log;
    for (String const* const none : {static_cast<String const*>(nullptr), &empty})
        EXPECT_EQ(CreateBitmapJNI(none, 1, 1), nullptr);
    jobject const other = MakeJavaBitmap("RGB_565", "");
    SetResult(other);
    EXPECT_EQ(CreateBitmapJNI(&good, 0, 0), nullptr); // read, but not as it should be
    EXPECT_EQ(GetRecycled(other), 0);
    SetResult(MakeJavaBitmap("ARGB_8888", "recycle"));
    EXPECT_TRUE(BitmapOwner(CreateBitmapJNI(&good, 0, 0)));
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR),
                ElementsAre("MKBitmapFactory : filename NULL", "MKBitmapFactory : filename 0",
                            HasSubstr("RGB_565"), "MKBitmapFactory : getMKBitmap false",
                            "MKBitmapFactory : recycle threw an exception"));
}

// On a thread that never returns to Java nobody else would end them. The VM's checks report those that gather, but no
// frames of them.
TEST_F(DecodeBridge, GathersNoLocalReferences) {
    LogCapture const quiet;
    String const path("/no/such.jpg");
    static int frames;
    frames = 0;
    PatchedFunctions counting(mEnv);
    counting->PushLocalFrame = [](JNIEnv* env, jint capacity) {
        ++frames;
        return PatchedFunctions::GetOriginal().PushLocalFrame(env, capacity);
    };
    counting->PopLocalFrame = [](JNIEnv* env, jobject result) {
        --frames;
        return PatchedFunctions::GetOriginal().PopLocalFrame(env, result);
    };
    for (jobject result : {MakeJavaBitmap("ARGB_8888", ""), MakeJavaBitmap("ARGB_8888", "recycle"),
                           MakeJavaBitmap("ALPHA_8", ""), jobject{}}) {
        SetResult(result);
        for (bool isThrowing : {false, true}) {
            SetThrowing(isThrowing);
            for (int i = 0; i < 100; ++i) BitmapOwner(CreateBitmapJNI(&path, 0, 0));
        }
    }
    EXPECT_EQ(frames, 0);
}

} // namespace
} // namespace Moka::Testing
