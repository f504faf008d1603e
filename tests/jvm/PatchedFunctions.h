// PatchedFunctions: puts a copy of JNI's function table, for changing, in place of the thread's own for a
// scope. The functions that are not changed are the VM's, with its checks.
#pragma once

#include <jni.h>
#include <string>

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

// For a scope, a lookup by this name finds nothing, however the class path looks.
class MissingName {
public:
    MissingName(JNIEnv* env, char const* name) : mFunctions(env) {
        sMissing = name;
        sOriginal = &mFunctions.GetOriginal();
        mFunctions->FindClass = [](JNIEnv* e, char const* type) {
            return sOriginal->FindClass(e, Hide(type));
        };
        mFunctions->GetStaticMethodID = [](JNIEnv* e, jclass type, char const* method,
                                           char const* signature) {
            return sOriginal->GetStaticMethodID(e, type, Hide(method), signature);
        };
        mFunctions->GetMethodID = [](JNIEnv* e, jclass type, char const* method, char const* signature) {
            return sOriginal->GetMethodID(e, type, Hide(method), signature);
        };
    }
    JNINativeInterface_* operator->() { return mFunctions.operator->(); }
    JNINativeInterface_ const& GetOriginal() const { return mFunctions.GetOriginal(); }

private:
    static char const* Hide(char const* name) { return sMissing == name ? "isNotThere" : name; }

    static inline std::string sMissing;
    static inline JNINativeInterface_ const* sOriginal;
    PatchedFunctions mFunctions;
};

} // namespace Moka::Testing
