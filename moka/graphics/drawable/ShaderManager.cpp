#include "moka/graphics/drawable/ShaderManager.h"

#include "moka/base/log/AndroidLog.h"

namespace Moka {

// Static memory that is never destroyed, because other static objects may release shaders at process exit.
ShaderManager* ShaderManager::GetInstance() {
    alignas(ShaderManager) static unsigned char memory[sizeof(ShaderManager)];
    static ShaderManager* const instance = new (memory) ShaderManager;
    return instance;
}

void ShaderManager::RemoveShader(Key const& key) {
    AutoCriticalSection const hold(mLock);
    mEntries.erase(key);
}

void ShaderManager::LogNew(char const* name) {
    __android_log_print(ANDROID_LOG_DEBUG, "mok_log", "ShaderManager::GetShader, New %s is added", name);
}

ShaderManager::Entry* ShaderManager::Find(char const* name) {
    auto const found = mEntries.find(name);
    return found == mEntries.end() ? nullptr : &found->second;
}

ShaderManager::Entry* ShaderManager::Add(char const* name, void* shader) {
    try {
        Entry& entry = mEntries[Key(name)];
        entry.shader = shader;
        return &entry;
    } catch (std::bad_alloc const&) {
        return nullptr;
    }
}

ShaderManager::Entries::iterator ShaderManager::FindToRelease(char const* name, void const* shader) {
    auto const found = mEntries.find(name);
    if (found == mEntries.end()) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "%s. Shader (%s) not in shader manager (not found).", "ReleaseShader", name);
        return found;
    }
    if (found->second.shader == shader) return found;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "%s. Shader (%s) not in shader manager (pointer mismatch).", "ReleaseShader", name);
    return mEntries.end();
}

} // namespace Moka
