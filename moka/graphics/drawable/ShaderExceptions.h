// ShaderExceptions.h: a program and the code that sets its uniforms disagree: a mistake of the developer's,
// met when the shader is made, or when a parameter is set that was never bound.
#pragma once

#include "moka/base/Export.h"

#include <exception>
#include <string>

namespace Moka {

// A uniform is of another type than the binding.
class MOKA_API InvalidArgumentException : public std::exception {
public:
    explicit InvalidArgumentException(char const* message) : mMessage(message) {}
    ~InvalidArgumentException() override;
    char const* what() const noexcept override { return mMessage.c_str(); }

private:
    std::string mMessage;
};

// A value for a binding that is bound to nothing.
class MOKA_API NotSupportedException : public std::exception {
public:
    explicit NotSupportedException(char const* message) : mMessage(message) {}
    ~NotSupportedException() override;
    char const* what() const noexcept override { return mMessage.c_str(); }

private:
    std::string mMessage;
};

} // namespace Moka
