// JavaFixture: a test in a frame of local references of its own, in which the VM's JNI checks may not speak,
// and the Java bitmaps of the test doubles.
#pragma once

#include "tests/jvm/JavaMachine.h"

#include <gtest/gtest.h>
#include <vector>

namespace Moka::Testing {

using Bytes = std::vector<unsigned char>;

// A Java bitmap. config and failing, the method that throws, may be null.
struct JavaPicture {
    int width = 1;
    int height = 1;
    int rowBytes = 4;
    char const* config = "ARGB_8888";
    Bytes pixels = {1, 2, 3, 4};
    char const* failing = nullptr;
};

class JavaFixture : public testing::Test {
protected:
    void SetUp() override {
        JavaMachine::TakeOutput();
        ASSERT_EQ(mEnv->PushLocalFrame(32), JNI_OK);
    }
    void TearDown() override {
        EXPECT_FALSE(mEnv->ExceptionCheck());
        mEnv->PopLocalFrame(nullptr);
        EXPECT_EQ(JavaMachine::TakeOutput(), "") << "JNI's own checks have something to say";
    }

    // A local reference, in the caller's frame; what it takes to get there is given back.
    jobject MakeJavaBitmap(JavaPicture const& picture = {}) const {
        auto const toString = [this](char const* text) { return text ? mEnv->NewStringUTF(text) : nullptr; };
        mEnv->PushLocalFrame(16);
        auto const size = static_cast<jsize>(picture.pixels.size());
        jbyteArray const pixels = mEnv->NewByteArray(size);
        mEnv->SetByteArrayRegion(pixels, 0, size, reinterpret_cast<jbyte const*>(picture.pixels.data()));
        jclass const type = mEnv->FindClass("android/graphics/Bitmap");
        jmethodID const init =
            mEnv->GetMethodID(type, "<init>", "(IIILjava/lang/String;[BLjava/lang/String;)V");
        jobject const made = mEnv->NewObject(type, init, picture.width, picture.height, picture.rowBytes,
                                             toString(picture.config), pixels, toString(picture.failing));
        EXPECT_FALSE(mEnv->ExceptionCheck());
        return mEnv->PopLocalFrame(made);
    }
    int GetRecycled(jobject javaBitmap) const {
        jclass const type = mEnv->GetObjectClass(javaBitmap);
        int const recycled = mEnv->GetIntField(javaBitmap, mEnv->GetFieldID(type, "recycled", "I"));
        mEnv->DeleteLocalRef(type);
        return recycled;
    }

    JNIEnv* const mEnv = JavaMachine::GetMainEnv();
};

} // namespace Moka::Testing
