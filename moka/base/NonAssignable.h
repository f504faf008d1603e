// NonAssignable: a base class that prevents copying and assignment.
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
