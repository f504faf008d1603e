/// ShaderExceptions.h: exceptions for programming errors: the code that sets a program's uniforms does not
/// match the program. They are thrown when the shader is created, or when a parameter is set that was never
/// bound.
#pragma once

#include "moka/base/Export.h"

#include <cstring>
#include <exception>

namespace Moka {

namespace detail {

/// A message that is stored without allocating memory, cut at 127 bytes.
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

/// Thrown if a uniform has another type than its binding.
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

/// Thrown if a value is assigned to an unbound binding.
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
