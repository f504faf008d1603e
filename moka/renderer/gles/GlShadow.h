// GlShadow: caches one part of GL state as a comparable value. It calls GL only if the value differs, and
// queries GL only if the value is unknown. GlOverride changes the value for a scope.
// An Access type supplies the Value (with ==), Apply(value, known), where known is null if the value is
// unknown, and Query() if Get() is used.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/Counters.h"

#include <optional>

namespace Moka::detail {

template <class Access>
class GlShadow {
public:
    using Value = typename Access::Value;

    explicit GlShadow(Counters& counters) : mCounters(counters) {}

    Value const& Get() {
        if (!mValue) {
            mValue = Access::Query();
            ++mCounters.queries;
        }
        return *mValue;
    }

    // Returns true if it called GL.
    bool Set(Value const& value) {
        if (mValue && *mValue == value) return false;
        Access::Apply(value, mValue ? &*mValue : nullptr);
        mValue = value;
        return true;
    }

    void Forget() { mValue.reset(); }

    // Gives access to the cached value, to follow changes that GL makes itself. Null if the value is unknown.
    Value* Known() { return mValue ? &*mValue : nullptr; }

private:
    Counters& mCounters;
    std::optional<Value> mValue;
};

template <class Access>
class GlOverride {
public:
    GlOverride(GlShadow<Access>& shadow, typename Access::Value const& value)
        : mShadow(shadow), mSaved(shadow.Get()) {
        mShadow.Set(value);
    }
    ~GlOverride() { mShadow.Set(mSaved); }
    GlOverride(GlOverride const&) = delete;
    GlOverride& operator=(GlOverride const&) = delete;

private:
    GlShadow<Access>& mShadow;
    typename Access::Value const mSaved;
};

} // namespace Moka::detail
