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

std::string GetJavaThreadName(JNIEnv* env) {
    jclass const type = env->FindClass("java/lang/Thread");
    jmethodID const current = env->GetStaticMethodID(type, "currentThread", "()Ljava/lang/Thread;");
    jobject const thread = env->CallStaticObjectMethod(type, current);
    auto const name = static_cast<jstring>(
        env->GetObjectField(thread, env->GetFieldID(type, "name", "Ljava/lang/String;")));
    char text[64] = {};
    env->GetStringUTFRegion(name, 0, env->GetStringLength(name), text);
    return text;
}

TEST(JNIAutoThread, AttachesAThreadForTheOutermostScopeUnderItsOwnName) {
    std::thread([] {
        pthread_setname_np(pthread_self(), "loader \xc3\xa9");
        {
            JNIAutoThread const outer(JavaMachine::GetVm());
            ASSERT_NE(outer.GetEnv(), nullptr);
            EXPECT_EQ(JNIAutoThread(JavaMachine::GetVm()).GetEnv(), outer.GetEnv());
            EXPECT_TRUE(IsAttached());
            EXPECT_EQ(GetJavaThreadName(outer.GetEnv()), "loader ??");
        }
        EXPECT_FALSE(IsAttached());
    }).join();
    // A thread that others attached stays as it is.
    EXPECT_EQ(JNIAutoThread(JavaMachine::GetVm()).GetEnv(), JavaMachine::GetMainEnv());
    EXPECT_TRUE(IsAttached());
}

// A VM that takes no thread is not believed when it gives an env all the same.
TEST(JNIAutoThread, GivesNoEnvAndOneErrorLineWithoutAVmThatTakesTheThread) {
    JNIInvokeInterface_ functions = {};
    functions.AttachCurrentThread = [](JavaVM*, void** env, void*) -> jint {
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
    for (JavaVM* const each : {static_cast<JavaVM*>(nullptr), &vm}) {
        LogCapture log;
        { EXPECT_EQ(JNIAutoThread(each).GetEnv(), nullptr); }
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "JNIAutoThread: "), 1);
        EXPECT_EQ(log.GetLines().size(), 1u);
    }
}

} // namespace
} // namespace Moka::Testing
