/// RefCount: an atomic reference count that deletes its object when the last reference goes.
/// Owner:   starts at one, which belongs to the creator.
/// Thread:  any. The last Unref sees everything that other threads did before theirs.
/// Usable as a public, private or second base: the object is deleted through the virtual destructor.
#pragma once

#include "moka/base/Export.h"

#include <atomic>

namespace Moka {

class MOKA_API RefCount {
public:
    RefCount() noexcept = default;
    RefCount(RefCount const&) = delete;
    RefCount& operator=(RefCount const&) = delete;
    virtual ~RefCount();

    /// Both return the count after the operation. After an Unref that returned 0 the object is gone.
    int Ref() noexcept;
    int Unref();

    /// A snapshot; only a caller that knows nobody else holds a reference can rely on it.
    int GetRefCount() const noexcept;

private:
    std::atomic<int> mCount{1};
};

} // namespace Moka
