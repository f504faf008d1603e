// What the loading registers and says, and the native records behind Java's displays.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/jni/Display.h"
#include "moka/graphics/jni/OnLoad.h"
#include "tests/jvm/JavaFixture.h"
#include "tests/jvm/PatchedFunctions.h"
#include "tests/support/Allocation.h"
#include "tests/support/LogCapture.h"

#include <cstdint>
#include <cstring>
#include <gmock/gmock.h>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using testing::ElementsAre;
using Registration = JavaFixture;

constexpr char const* kDisplay = "com/velmora/android/sdk/pen/view/MokaDisplay";

TEST_F(Registration, AJavaDisplayHasANativeRecordOfItsValuesUntilItIsClosed) {
    std::int64_t const before = Faults::CountLive(Faults::Kind::Objects);
    LogCapture const quiet;
    Display_OnLoad(JavaMachine::GetVm());
    jclass const type = mEnv->FindClass(kDisplay);
    auto const find = [&](char const* name, std::string const& signature) {
        EXPECT_FALSE(mEnv->ExceptionCheck()) << "before " << name;
        return mEnv->GetMethodID(type, name, signature.c_str());
    };
    auto const make = [&](auto... values) {
        return mEnv->NewObject(type, find("<init>", "(IIFIIFFIFFIIIZJ)V"), values...);
    };
    auto const call = [&](jobject display, char const* name, std::string const& parameters, auto... values) {
        mEnv->CallVoidMethod(display, find(name, "(" + parameters + ")V"), values...);
    };
    auto const get = [&](jobject display) {
        jlong const handle = mEnv->CallLongMethod(display, find("getHandle", "()J"));
        return reinterpret_cast<Display const*>(static_cast<std::intptr_t>(handle));
    };
    jobject const source =
        make(1, -2, 3.5, 4, 5, 6.25, 7.125, 8, 9.5, -10.5, 11, 12, 13, JNI_TRUE, jlong{0x1234567890ab});
    jobject const copy = make(0, 0, 0.0, 0, 0, 0.0, 0.0, 0, 0.0, 0.0, 0, 0, 0, JNI_FALSE, jlong{0});
    call(source, "setDebugLevel", "I", -3);
    call(source, "updateScreenOrientation", "I", 99);
    call(copy, "copy", "L" + std::string(kDisplay) + ";", source);
    EXPECT_EQ(get(source)->GetDensityDpi(), 8);
    EXPECT_TRUE(get(source)->IsTablet());
    EXPECT_FALSE(get(source)->IsUWP());
    Display const& copied = *get(copy);
    EXPECT_THAT((std::vector<double>{double(copied.GetWidthPixels()), double(copied.GetHeightPixels()),
                                     copied.GetSystemDensity(), double(copied.GetLocalWidthPixels()),
                                     double(copied.GetLocalHeightPixels()), copied.GetDensity(),
                                     copied.GetScaledDensity(), copied.GetXdpi(), copied.GetYdpi()}),
                ElementsAre(1, -2, 3.5, 4, 5, 6.25, 7.125, 9.5, -10.5));
    EXPECT_EQ(copied.GetLayoutDirection(), Display::LayoutDirection{11});
    EXPECT_EQ(copied.GetOrientation(), Display::Orientation{12});
    EXPECT_EQ(copied.GetScreenOrientation(), Display::ScreenOrientation{99});
    EXPECT_EQ(copied.GetAppVsyncOffsetNanos(), 0x1234567890abL);
    EXPECT_EQ(copied.GetDebugLevel(), -3);
    for (jobject const display : {source, copy, copy}) call(display, "close", "");
    EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), before);
}

// What is looked up next is looked up under the first one's exception, which nobody is to clear; the VM's checks say so.
TEST_F(Registration, AClassThatIsMissingIsTheExceptionOfTheLoading) {
    struct {
        char const* name;
        char const* line;
        int priority;
    } const cases[] = {
        {"com/velmora/android/sdk/pen/graphics/MokaBitmapLoader", "Cannot find BitmapLoader Class",
         ANDROID_LOG_ERROR},
        {kDisplay, "Cannot find Display Class", ANDROID_LOG_INFO},
        {"no class", "RegisterNatives is failed", ANDROID_LOG_INFO},
        {"no class", "RegisterNatives is failed", ANDROID_LOG_ERROR},
    };
    for (auto const& [name, line, priority] : cases) {
        LogCapture const log;
        {
            PatchedFunctions missing(mEnv, name);
            // Or the loader's thread would be started. The VM's own classes come by as well: looking ours up may
            // be the first use of them.
            missing->RegisterNatives = [](JNIEnv* env, jclass type, JNINativeMethod const* methods,
                                          jint count) {
                return std::strncmp(methods->name, "Native_", 7) == 0
                           ? -1
                           : PatchedFunctions::GetOriginal().RegisterNatives(env, type, methods, count);
            };
            JNI_OnLoad(JavaMachine::GetVm(), nullptr);
        }
        EXPECT_EQ(mEnv->ExceptionCheck(), std::string(name) != "no class") << name;
        mEnv->ExceptionClear();
        EXPECT_EQ(log.Count(priority, line), 1) << name;
        EXPECT_EQ(log.Count(ANDROID_LOG_INFO, "Success"), 1) << "of the whole";
    }
    EXPECT_THAT(JavaMachine::TakeOutput(), testing::HasSubstr("exception pending"));
}

TEST_F(Registration, AVmThatIsTooOldIsRefused) {
    JNIInvokeInterface_ functions = {};
    JavaVM vm = {};
    vm.functions = &functions;
    static std::vector<jint> versions;
    versions.clear();
    functions.GetEnv = [](JavaVM*, void**, jint version) -> jint {
        versions.push_back(version);
        return JNI_EVERSION;
    };
    LogCapture log;
    EXPECT_EQ(JNI_OnLoad(&vm, nullptr), 0);
    EXPECT_THAT(log.GetTexts(), ElementsAre("Graphics JNI_OnLoad enter!!", "JNI_VERSION is different"));
    EXPECT_EQ(log.Find("JNI_VERSION is different").priority, ANDROID_LOG_ERROR);
    log.Clear();
    Display_OnLoad(&vm);
    EXPECT_THAT(log.GetTexts(), ElementsAre("Display JNI_OnLoad enter!!", "Display : Cannot find env"));
    EXPECT_EQ(log.Find("Display : Cannot find env").tag, "DisplayGlue");
    EXPECT_THAT(versions, ElementsAre(0x10004, 0x10002));
}

} // namespace
} // namespace Moka::Testing
