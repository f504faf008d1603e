// ShaderManager: the shader programs in use, one of each class, shared by everything that draws with it: made
// for the first user, destroyed when the last one gives it back.
// A shader class has a default constructor that compiles, and a destructor; see ShaderClass.h.
// Owner:  the process; the shaders are the manager's.
// Thread: render thread, where the shaders are made and destroyed. A lock is held meanwhile, so that no class
//         is compiled twice.
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
    // Names a shader class: the text of its run-time type. Compared with such a text as well, so that only a new
    // entry takes memory: shaders are given back in destructors.
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

    // The shader of the class, with one user more; give it back with ReleaseShader. Null when memory ran out:
    // for the shader, whose class then has none from here on, or for its entry, which the next call tries
    // again. An exception of the shader's constructor passes through and changes nothing.
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
            static_cast<void>(shader.release()); // the entry's now
        }
        ++entry->users;
        return static_cast<T*>(entry->shader);
    }

    // Null does nothing; a shader that is not the manager's gets an error line and stays as it is.
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

    // Forgets the class's shader without destroying it. Does nothing for a class that has none.
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
    // Null when memory ran out.
    Entry* Add(char const* name, void* shader);
    // The end, with an error line, when the manager has none of the class or another one.
    Entries::iterator FindToRelease(char const* name, void const* shader);

    CriticalSection mLock{true}; // recursive: the last release removes the entry while it holds it
    Entries mEntries;
};

} // namespace Moka
