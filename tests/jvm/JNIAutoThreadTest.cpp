#include "moka/base/jni/JNIAutoThread.h"
#include "moka/base/log/AndroidLog.h"
#include "tests/jvm/JavaMachine.h"
#include "tests/support/LogCapture.h"

#include <gtest/gtest.h>
#include <pthread.h>
#include <thread>

namespace Moka::Testing {
namespace {

bool IsAttached() {
    void* env = nullptr;
    return JavaMachine::GetVm()->GetEnv(&env, JNI_VERSION_1_6) == JNI_OK;
}

TEST(JNIAutoThread, AttachesAThreadForTheOutermostScope) {
    std::thread([] {
        {
            JNIAutoThread const outer(JavaMachine::GetVm());
            ASSERT_NE(outer.GetEnv(), nullptr);
            EXPECT_EQ(JNIAutoThread(JavaMachine::GetVm()).GetEnv(), outer.GetEnv());
            EXPECT_TRUE(IsAttached());
        }
        EXPECT_FALSE(IsAttached());
    }).join();
    // A thread that others attached stays as it is.
    EXPECT_EQ(JNIAutoThread(JavaMachine::GetVm()).GetEnv(), JavaMachine::GetMainEnv());
    EXPECT_TRUE(IsAttached());
}

// A VM that takes no thread, which it is told the name of, is not believed when it gives an env all the same.
TEST(JNIAutoThread, GivesNoEnvAndOneErrorLineWithoutAVmThatTakesTheThread) {
    JNIInvokeInterface_ functions = {};
    functions.AttachCurrentThread = [](JavaVM*, void** env, void* arguments) -> jint {
        EXPECT_STREQ(static_cast<JavaVMAttachArgs*>(arguments)->name, "loader ??");
        *env = env;
        return JNI_ENOMEM;
    };
    functions.DetachCurrentThread = [](JavaVM*) -> jint {
        ADD_FAILURE() << "detached";
        return JNI_OK;
    };
    JavaVM vm = {};
    vm.functions = &functions;
    functions.GetEnv = [](JavaVM*, void**, jint) -> jint { return JNI_EDETACHED; };
    std::thread([&vm] {
        pthread_setname_np(pthread_self(), "loader \xc3\xa9");
        for (JavaVM* const each : {static_cast<JavaVM*>(nullptr), &vm}) {
            LogCapture log;
            EXPECT_EQ(JNIAutoThread(each).GetEnv(), nullptr);
            EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "JNIAutoThread: "), 1);
            EXPECT_EQ(log.GetLines().size(), 1u);
        }
    }).join();
}

} // namespace
} // namespace Moka::Testing
