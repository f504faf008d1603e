#include "moka/graphics/drawable/ShaderManager.h"

#include "moka/base/log/AndroidLog.h"

namespace Moka {

// Statics elsewhere may give shaders back while the process ends.
ShaderManager* ShaderManager::GetInstance() {
    static ShaderManager* const instance = new ShaderManager;
    return instance;
}

void ShaderManager::RemoveShader(Key const& key) {
    AutoCriticalSection const hold(mLock);
    mEntries.erase(key);
}

void ShaderManager::LogNew(char const* name) {
    __android_log_print(ANDROID_LOG_DEBUG, "mok_log", "ShaderManager::GetShader, New %s is added", name);
}

ShaderManager::Entry* ShaderManager::Find(Key const& key) {
    auto const found = mEntries.find(key);
    return found == mEntries.end() ? nullptr : &found->second;
}

ShaderManager::Entry& ShaderManager::Add(Key const& key, void* shader) {
    Entry& entry = mEntries[key];
    entry.shader = shader;
    return entry;
}

ShaderManager::Entry* ShaderManager::FindToRelease(Key const& key, void const* shader) {
    Entry* const entry = Find(key);
    if (!entry) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "%s. Shader (%s) not in shader manager (not found).", "ReleaseShader",
                            key.GetName());
        return nullptr;
    }
    if (entry->shader != shader) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "%s. Shader (%s) not in shader manager (pointer mismatch).", "ReleaseShader",
                            key.GetName());
        return nullptr;
    }
    return entry;
}

} // namespace Moka
