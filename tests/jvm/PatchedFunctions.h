// PatchedFunctions: puts a copy of JNI's function table, for changing, in place of the thread's own for a
// scope. The functions that are not changed are the VM's, with its checks.
#pragma once

#include <jni.h>
#include <string>

namespace Moka::Testing {

class PatchedFunctions {
public:
    // A lookup by the missing name finds nothing, however the class path looks.
    explicit PatchedFunctions(JNIEnv* env, char const* missing = "") : mEnv(env), mPatched(*env->functions) {
        sMissing = missing;
        sOriginal = env->functions;
        env->functions = &mPatched;
        mPatched.FindClass = [](JNIEnv* e, char const* type) { return sOriginal->FindClass(e, Hide(type)); };
        mPatched.GetStaticMethodID = [](JNIEnv* e, jclass type, char const* method, char const* signature) {
            return sOriginal->GetStaticMethodID(e, type, Hide(method), signature);
        };
        mPatched.GetMethodID = [](JNIEnv* e, jclass type, char const* method, char const* signature) {
            return sOriginal->GetMethodID(e, type, Hide(method), signature);
        };
    }
    ~PatchedFunctions() { mEnv->functions = sOriginal; }
    PatchedFunctions(PatchedFunctions const&) = delete;
    PatchedFunctions& operator=(PatchedFunctions const&) = delete;

    JNINativeInterface_* operator->() { return &mPatched; }
    // The VM's, of the scope that was entered last.
    static JNINativeInterface_ const& GetOriginal() { return *sOriginal; }

private:
    static char const* Hide(char const* name) { return sMissing == name ? "isNotThere" : name; }

    static inline std::string sMissing;
    static inline JNINativeInterface_ const* sOriginal;
    JNIEnv* const mEnv;
    JNINativeInterface_ mPatched;
};

} // namespace Moka::Testing
