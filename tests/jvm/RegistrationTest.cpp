// What Java hands to the natives that are registered, and what the loading says.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/jni/Display.h"
#include "moka/graphics/jni/OnLoad.h"
#include "tests/jvm/JavaMachine.h"
#include "tests/jvm/PatchedFunctions.h"
#include "tests/support/LogCapture.h"

#include <cstdint>
#include <cstring>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using testing::ElementsAre;

std::vector<JNINativeMethod> registered;
jint registration;

// The VM's own classes come by as well: looking ours up may be the first use of them.
jint JNICALL RegisterNatives(JNIEnv* env, jclass type, JNINativeMethod const* methods, jint count) {
    if (std::strncmp(methods->name, "Native_", 7) != 0)
        return PatchedFunctions::GetOriginal().RegisterNatives(env, type, methods, count);
    registered.assign(methods, methods + count);
    return registration;
}

// The display's natives, as they would be registered.
std::vector<std::string> LoadDisplay(jint result) {
    PatchedFunctions functions(JavaMachine::GetMainEnv());
    functions->RegisterNatives = &RegisterNatives;
    registration = result;
    LogCapture log;
    Display_OnLoad(JavaMachine::GetVm());
    for (LogLine const& line : log.GetLines()) {
        EXPECT_EQ(line.tag, "DisplayGlue");
        EXPECT_EQ(line.priority, ANDROID_LOG_INFO);
    }
    return log.GetTexts();
}

template <class Function>
Function* GetNative(std::size_t index) {
    return reinterpret_cast<Function*>(registered.at(index).fnPtr);
}

TEST(Registration, DisplayHasFiveNativesInOrder) {
    EXPECT_THAT(LoadDisplay(0), ElementsAre("Display JNI_OnLoad enter!!", "Display JNI_OnLoad Success"));
    std::vector<std::string> texts;
    for (JNINativeMethod const& method : registered)
        texts.push_back(std::string(method.name) + method.signature);
    EXPECT_THAT(texts, ElementsAre("Native_init(IIFIIFFIFFIIIZJ)J", "Native_finalize(J)V", "Native_copy(JJ)V",
                                   "Native_setDebugLevel(JI)V", "Native_updateScreenOrientation(JI)V"));
    EXPECT_THAT(LoadDisplay(-1), ElementsAre("Display JNI_OnLoad enter!!", "RegisterNatives is failed"));
}

class CountedDisplay : public Display {
public:
    CountedDisplay()
        : Display(1, 1, 1, 1, 1, 1, 1, 1, 1, 1, LayoutDirection{0}, Orientation{0}, ScreenOrientation{0},
                  false, false, 0) {}
    ~CountedDisplay() override { ++destroyed; }

    static inline int destroyed = 0;
};

TEST(Registration, DisplayNativesMakeChangeCopyAndDestroyDisplays) {
    LoadDisplay(0);
    auto const init = GetNative<jlong(JNIEnv*, jclass, jint, jint, jfloat, jint, jint, jfloat, jfloat, jint,
                                      jfloat, jfloat, jint, jint, jint, jboolean, jlong)>(0);
    jlong const handle = init(nullptr, nullptr, 1, -2, 3.5f, 4, 5, 6.25f, 7.125f, 8, 9.5f, -10.5f, 11, 12, 13,
                              JNI_TRUE, 0x1234567890abL);
    GetNative<void(JNIEnv*, jclass, jlong, jint)>(3)(nullptr, nullptr, handle, -3);
    GetNative<void(JNIEnv*, jclass, jlong, jint)>(4)(nullptr, nullptr, handle, 99);
    auto* const copy = new CountedDisplay;
    auto const copied = static_cast<jlong>(reinterpret_cast<std::intptr_t>(copy));
    GetNative<void(JNIEnv*, jclass, jlong, jlong)>(2)(nullptr, nullptr, copied, handle);
    auto const finalize = GetNative<void(JNIEnv*, jclass, jlong)>(1);
    finalize(nullptr, nullptr, handle);
    EXPECT_THAT((std::vector<double>{double(copy->GetWidthPixels()), double(copy->GetHeightPixels()),
                                     copy->GetSystemDensity(), double(copy->GetLocalWidthPixels()),
                                     double(copy->GetLocalHeightPixels()), copy->GetDensity(),
                                     copy->GetScaledDensity(), copy->GetXdpi(), copy->GetYdpi()}),
                ElementsAre(1, -2, 3.5, 4, 5, 6.25, 7.125, 9.5, -10.5));
    EXPECT_EQ(copy->GetLayoutDirection(), Display::LayoutDirection{11});
    EXPECT_EQ(copy->GetOrientation(), Display::Orientation{12});
    EXPECT_EQ(copy->GetScreenOrientation(), Display::ScreenOrientation{99});
    EXPECT_EQ(copy->GetAppVsyncOffsetNanos(), 0x1234567890abL);
    EXPECT_EQ(copy->GetDebugLevel(), -3);
    finalize(nullptr, nullptr, copied);
    finalize(nullptr, nullptr, 0);
    EXPECT_EQ(CountedDisplay::destroyed, 1);
}

// What is looked up next is looked up under the first one's exception, which nobody is to clear.
TEST(Registration, AClassThatIsMissingIsTheExceptionOfTheLoading) {
    JNIEnv* const env = JavaMachine::GetMainEnv();
    struct {
        char const* name;
        char const* line;
    } const cases[] = {
        {"com/velmora/android/sdk/pen/graphics/MokaBitmapLoader", "Cannot find BitmapLoader Class"},
        {"com/velmora/android/sdk/pen/view/MokaDisplay", "Cannot find Display Class"},
        {"no class", "RegisterNatives is failed"},
    };
    for (auto const& [name, line] : cases) {
        LogCapture const log;
        {
            PatchedFunctions missing(env, name);
            missing->RegisterNatives = &RegisterNatives;
            registration = -1; // or the loader's thread would be started
            JNI_OnLoad(JavaMachine::GetVm(), nullptr);
        }
        EXPECT_EQ(env->ExceptionCheck(), std::string(name) != "no class") << name;
        env->ExceptionClear();
        EXPECT_GE(log.Count(ANDROID_LOG_INFO, line) + log.Count(ANDROID_LOG_ERROR, line), 1) << name;
    }
}

TEST(Registration, AVmThatIsTooOldIsRefused) {
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
    EXPECT_THAT(versions, ElementsAre(0x10004, 0x10002));
}

} // namespace
} // namespace Moka::Testing
