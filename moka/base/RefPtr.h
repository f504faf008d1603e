/// RefPtr: a pointer that holds one reference on an object with Ref() and Unref().
/// Adopt uses a reference that the caller has; Share takes a new one.
#pragma once

#include <utility>

namespace Moka {

template <class T>
class RefPtr {
public:
    RefPtr() noexcept = default;
    /// A copy takes a new reference; a move transfers it.
    RefPtr(RefPtr const& other) : mObject(other.mObject) {
        if (mObject) mObject->Ref();
    }
    RefPtr(RefPtr&& other) noexcept : mObject(std::exchange(other.mObject, nullptr)) {}
    RefPtr& operator=(RefPtr other) noexcept {
        std::swap(mObject, other.mObject);
        return *this;
    }
    ~RefPtr() {
        if (mObject) mObject->Unref();
    }

    /// Takes ownership of a reference that the caller has. Null makes an empty pointer.
    static RefPtr Adopt(T* object) noexcept {
        RefPtr pointer;
        pointer.mObject = object;
        return pointer;
    }
    /// Takes a new reference. Null makes an empty pointer.
    static RefPtr Share(T* object) {
        if (object) object->Ref();
        return Adopt(object);
    }

    /// The object; null if empty. The caller gets no reference.
    T* Get() const noexcept { return mObject; }
    T* operator->() const noexcept { return mObject; }
    T& operator*() const noexcept { return *mObject; }
    explicit operator bool() const noexcept { return mObject != nullptr; }

    /// Makes the pointer empty and returns the object. The caller then owns the reference.
    [[nodiscard]] T* Release() noexcept { return std::exchange(mObject, nullptr); }

private:
    T* mObject = nullptr;
};

} // namespace Moka
