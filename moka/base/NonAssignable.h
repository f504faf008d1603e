// NonAssignable: base of classes that are neither copied nor assigned.
#pragma once

namespace Moka {

class NonAssignable {
public:
    NonAssignable(NonAssignable const&) = delete;
    NonAssignable& operator=(NonAssignable const&) = delete;

protected:
    NonAssignable() = default;
    ~NonAssignable() = default;
};

} // namespace Moka
