/// ShaderExceptions.h: a program and the code that sets its uniforms disagree: a mistake of the developer's,
/// thrown when the shader is created, or when a parameter is set that was never bound.
#pragma once

#include "moka/base/Export.h"

#include <cstring>
#include <exception>

namespace Moka {

namespace detail {

/// A message that needs no memory: it is complete even without memory. Cut at 127 bytes.
class ShaderMessage {
public:
    /// Copies text.
    explicit ShaderMessage(char const* text) noexcept {
        std::memcpy(mText, text, strnlen(text, sizeof mText - 1));
    }
    /// The message.
    char const* Get() const noexcept { return mText; }

private:
    char mText[128] = {};
};

} // namespace detail

/// A uniform is of another type than the binding.
class MOKA_API InvalidArgumentException : public std::exception {
public:
    /// Copies message.
    explicit InvalidArgumentException(char const* message) noexcept : mMessage(message) {}
    ~InvalidArgumentException() override;
    /// The message.
    char const* what() const noexcept override { return mMessage.Get(); }

private:
    detail::ShaderMessage mMessage;
};

/// A value for a binding that is bound to nothing.
class MOKA_API NotSupportedException : public std::exception {
public:
    /// Copies message.
    explicit NotSupportedException(char const* message) noexcept : mMessage(message) {}
    ~NotSupportedException() override;
    char const* what() const noexcept override { return mMessage.Get(); }

private:
    detail::ShaderMessage mMessage;
};

} // namespace Moka
