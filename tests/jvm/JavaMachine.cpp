#include "tests/jvm/JavaMachine.h"

#include <cstdarg>
#include <cstdio>
#include <gtest/gtest.h>
#include <iterator>
#include <mutex>
#include <utility>

namespace Moka::Testing {
namespace {

JavaVM* machine = nullptr;
JNIEnv* mainEnv = nullptr;

std::mutex outputMutex;
std::string output;

// The VM hands over everything it would print. Shown as well: what it says before it aborts, nobody takes.
jint JNICALL Collect(FILE*, char const* format, va_list arguments) {
    char text[4096];
    int const length = std::vsnprintf(text, sizeof text, format, arguments);
    std::lock_guard<std::mutex> lock(outputMutex);
    output += text;
    std::fputs(text, stderr);
    return length;
}

class MachineEnvironment : public testing::Environment {
public:
    void SetUp() override {
        auto const option = [](char const* text, void* extra = nullptr) {
            return JavaVMOption{const_cast<char*>(text), extra};
        };
        JavaVMOption options[] = {option("-Djava.class.path=" MOKA_JVM_TEST_CLASSES), option("-Xcheck:jni"),
                                  option("-Xmx64m"), option("-XX:+UseSerialGC"),
                                  option("vfprintf", reinterpret_cast<void*>(&Collect))};
        JavaVMInitArgs arguments = {};
        arguments.version = JNI_VERSION_1_8;
        arguments.options = options;
        arguments.nOptions = static_cast<jint>(std::size(options));
        void* env = nullptr;
        ASSERT_EQ(JNI_CreateJavaVM(&machine, &env, &arguments), JNI_OK);
        mainEnv = static_cast<JNIEnv*>(env);
    }

    void TearDown() override {
        if (machine) machine->DestroyJavaVM();
    }
};

[[maybe_unused]] testing::Environment* const environment =
    testing::AddGlobalTestEnvironment(new MachineEnvironment);

} // namespace

JavaVM* JavaMachine::GetVm() { return machine; }
JNIEnv* JavaMachine::GetMainEnv() { return mainEnv; }

std::string JavaMachine::TakeOutput() {
    std::lock_guard<std::mutex> lock(outputMutex);
    return std::exchange(output, {});
}

} // namespace Moka::Testing
