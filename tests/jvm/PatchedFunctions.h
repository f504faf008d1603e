// PatchedFunctions: puts a copy of JNI's function table, for changing, in place of the thread's own for a
// scope. The functions that are not changed are the VM's, with its checks.
#pragma once

#include <jni.h>

namespace Moka::Testing {

class PatchedFunctions {
public:
    explicit PatchedFunctions(JNIEnv* env) : mEnv(env), mOriginal(env->functions), mPatched(*env->functions) {
        env->functions = &mPatched;
    }
    ~PatchedFunctions() { mEnv->functions = mOriginal; }
    PatchedFunctions(PatchedFunctions const&) = delete;
    PatchedFunctions& operator=(PatchedFunctions const&) = delete;

    JNINativeInterface_* operator->() { return &mPatched; }
    JNINativeInterface_ const& GetOriginal() const { return *mOriginal; }

private:
    JNIEnv* const mEnv;
    JNINativeInterface_ const* const mOriginal;
    JNINativeInterface_ mPatched;
};

} // namespace Moka::Testing
