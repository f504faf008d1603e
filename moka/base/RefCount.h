/// RefCount: an atomic reference count that deletes its object when the last reference is dropped.
/// Owner:   the count starts at one, for the creator.
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

    /// Take or drop a reference, and return the count afterwards. If Unref returns 0, the object has been
    /// deleted.
    int Ref() noexcept;
    int Unref();

    /// A snapshot of the count. Other threads may change it at any time.
    int GetRefCount() const noexcept;

private:
    std::atomic<int> mCount{1};
};

} // namespace Moka
