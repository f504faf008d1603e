// JavaMachine: the Java VM of this test process, with JNI's own checks on. Started before the first case on
// the main thread, which stays attached, and ended after the last; the end waits for all that are attached.
#pragma once

#include <jni.h>
#include <string>

namespace Moka::Testing {

class JavaMachine {
public:
    static JavaVM* GetVm();
    static JNIEnv* GetMainEnv();

    // What the VM has written since the last call, the warnings of its JNI checks above all.
    static std::string TakeOutput();
};

} // namespace Moka::Testing
