// NeverDestroyed: a member whose destructor does not run, for objects that other threads still use at process
// exit.
#pragma once

#include "moka/base/NonAssignable.h"

#include <utility>

namespace Moka::detail {

template <class T>
class NeverDestroyed : NonAssignable {
public:
    template <class... Arguments>
    explicit NeverDestroyed(Arguments&&... arguments) : mValue(std::forward<Arguments>(arguments)...) {}
    ~NeverDestroyed() {}

    T& operator*() { return mValue; }
    T* operator->() { return &mValue; }

private:
    union {
        T mValue;
    };
};

} // namespace Moka::detail
