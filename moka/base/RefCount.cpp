#include "moka/base/RefCount.h"

#include "moka/base/Check.h"

namespace Moka {

RefCount::~RefCount() = default;

int RefCount::Ref() noexcept {
    // Relaxed, because the caller already has access to the object through another reference.
    int const before = mCount.fetch_add(1, std::memory_order_relaxed);
    MOKA_CHECK(before > 0, "Ref of an object whose last reference is gone");
    return before + 1;
}

int RefCount::Unref() {
    int const after = mCount.fetch_sub(1, std::memory_order_acq_rel) - 1;
    MOKA_CHECK(after >= 0, "Unref without a reference");
    if (after == 0) delete this;
    return after;
}

int RefCount::GetRefCount() const noexcept { return mCount.load(std::memory_order_acquire); }

} // namespace Moka
