// GlShadow: one concept of GL state as a comparable value: set only when it differs, asked for only when
// unknown. GlOverride changes it for a scope.
// An Access type supplies the Value (with ==), Apply(value, known) with known null while nothing is known,
// and, where somebody asks for it, Query().
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

    // Whether GL had to be called.
    bool Set(Value const& value) {
        if (mValue && *mValue == value) return false;
        Access::Apply(value, mValue ? &*mValue : nullptr);
        mValue = value;
        return true;
    }

    void Forget() { mValue.reset(); }

    // For what GL changes by itself; null while nothing is known.
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
