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
#include <map>
#include <memory>
#include <new>
#include <string>
#include <typeinfo>

namespace Moka {

class MOKA_API ShaderManager : NonAssignable {
public:
    // Names a shader class: the text of its run-time type.
    class Key {
    public:
        explicit Key(char const* name) : mName(name) {}
        char const* GetName() const { return mName.c_str(); }
        friend bool operator<(Key const& a, Key const& b) { return a.mName < b.mName; }

    private:
        std::string mName;
    };

    // Never null and never destroyed.
    static ShaderManager* GetInstance();

    // The shader of the class, with one user more; give it back with ReleaseShader. Null when memory ran out
    // for it. What its constructor throws passes through and leaves everything as it was.
    template <class T>
    T* GetShader() {
        AutoCriticalSection const hold(mLock);
        char const* const name = typeid(T).name();
        Entry* entry = Find(Key(name));
        if (!entry) {
            LogNew(name);
            std::unique_ptr<T> shader(new (std::nothrow) T);
            entry = &Add(Key(name), shader.get());
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
        Key const key(typeid(T).name());
        Entry* const entry = FindToRelease(key, shader);
        if (!entry) return;
        if (entry->users == 1) {
            delete shader;
            RemoveShader(key);
        } else {
            --entry->users;
        }
    }

    // Forgets the class's shader without destroying it. Does nothing for a class that has none.
    void RemoveShader(Key const& key);

private:
    struct Entry {
        void* shader = nullptr;
        std::uint32_t users = 0;
    };

    ShaderManager() = default;
    ~ShaderManager() = default;

    static void LogNew(char const* name);
    Entry* Find(Key const& key);
    Entry& Add(Key const& key, void* shader);
    // Null, with an error line, when the manager has none of the class or another one.
    Entry* FindToRelease(Key const& key, void const* shader);

    CriticalSection mLock{true}; // recursive: the last release removes the entry while it holds it
    std::map<Key, Entry> mEntries;
};

} // namespace Moka
