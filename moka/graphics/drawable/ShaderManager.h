// ShaderManager: holds one shared object of each shader class in use. It creates the object for the first
// user and deletes it when the last user releases it.
// The constructor of a shader class compiles the program; see ShaderClass.h.
// Owner:  one static object for the process, which owns the shaders.
// Thread: render thread. A lock is held while a shader is created or deleted, so that no class is compiled
//         twice.
#pragma once

#include "moka/base/CriticalSection.h"
#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <new>
#include <string>
#include <typeinfo>

namespace Moka {

class MOKA_API ShaderManager : NonAssignable {
public:
    // The name of a shader class: typeid(T).name(). It can be compared with such a text directly, so that
    // looking up a class allocates nothing. Destructors release shaders and must not fail.
    class Key {
    public:
        explicit Key(char const* name) : mName(name) {}
        friend bool operator<(Key const& a, Key const& b) { return a.mName < b.mName; }
        friend bool operator<(Key const& key, char const* name) { return key.mName < name; }
        friend bool operator<(char const* name, Key const& key) { return name < key.mName; }

    private:
        std::string mName;
    };

    // Never null and never destroyed.
    static ShaderManager* GetInstance();

    // Returns the shader of the class and counts one more user, who must call ReleaseShader. Returns null if
    // memory ran out: for the shader, then all later calls for this class return null; or for its entry, then
    // the next call tries again. Exceptions of the shader's constructor pass through and change nothing.
    template <class T>
    T* GetShader() {
        AutoCriticalSection const hold(mLock);
        char const* const name = typeid(T).name();
        Entry* entry = Find(name);
        if (!entry) {
            LogNew(name);
            std::unique_ptr<T> shader(new (std::nothrow) T);
            entry = Add(name, shader.get());
            if (!entry) return nullptr;
            static_cast<void>(shader.release()); // the entry owns it
        }
        ++entry->users;
        return static_cast<T*>(entry->shader);
    }

    // Counts one user less. The last one deletes the shader. Null does nothing. An unknown shader logs an
    // error and is not deleted.
    template <class T>
    void ReleaseShader(T* shader) {
        if (!shader) return;
        AutoCriticalSection const hold(mLock);
        auto const held = FindToRelease(typeid(T).name(), shader);
        if (held == mEntries.end()) return;
        if (held->second.users == 1) {
            delete shader;
            RemoveShader(held->first);
        } else {
            --held->second.users;
        }
    }

    // Removes the entry of the class without deleting the shader. Does nothing if there is no entry.
    void RemoveShader(Key const& key);

private:
    struct Entry {
        void* shader = nullptr;
        std::uint32_t users = 0;
    };

    using Entries = std::map<Key, Entry, std::less<>>;

    ShaderManager() = default;
    ~ShaderManager() = default;

    static void LogNew(char const* name);
    Entry* Find(char const* name);
    // Returns null if memory runs out.
    Entry* Add(char const* name, void* shader);
    // Returns the entry that holds this shader. If there is none, logs an error and returns the end.
    Entries::iterator FindToRelease(char const* name, void const* shader);

    CriticalSection mLock{true}; // recursive: the last release removes the entry while it holds it
    Entries mEntries;
};

} // namespace Moka
