// ParameterBinding: a uniform of a program as a value to assign to: shader->uColor = paint.GetColor().
// Owner:  holds the renderer's handle and releases it.
// Thread: render thread.
// Fails:  with an exception and an error line: binding to a uniform of another type, and assigning unbound.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/math/Vector.h"
#include "moka/renderer/IParameterBinding.h"

namespace Moka {

class IShaderProgram;

namespace detail {

template <BindingType T>
struct BindingValue;
template <>
struct BindingValue<BindingTypeBool> {
    using Type = bool;
};
template <>
struct BindingValue<BindingTypeMatrix4> {
    using Type = Matrix4<float>;
};
template <>
struct BindingValue<BindingTypeVector2> {
    using Type = Vector2<float>;
};
template <>
struct BindingValue<BindingTypeVector4> {
    using Type = Vector4<float>;
};
template <>
struct BindingValue<BindingTypeFloat> {
    using Type = float;
};
template <>
struct BindingValue<BindingTypeInt> {
    using Type = int;
};
template <>
struct BindingValue<BindingTypeTextureUnit> {
    using Type = int;
};

// The part that does not depend on the type. A look-up that throws has released its handle.
MOKA_API IParameterBinding* LookUpParameter(IShaderProgram* program, char const* name, BindingType wanted);
[[noreturn]] MOKA_API void ThrowUnbound();

} // namespace detail

template <BindingType T>
class ParameterBinding {
public:
    using Value = typename detail::BindingValue<T>::Type;

    ParameterBinding() = default;
    ~ParameterBinding() { Release(); }
    ParameterBinding(ParameterBinding const&) = delete;
    ParameterBinding& operator=(ParameterBinding const&) = delete;

    // A uniform that the program lacks, or that its compiler removed, is accepted; values assigned to it
    // are dropped. Throws InvalidArgumentException, and is unbound, when the uniform is of another type.
    void bind(IShaderProgram* program, char const* name) {
        Release();
        mHandle = detail::LookUpParameter(program, name, T);
    }

    // Throws NotSupportedException while unbound.
    ParameterBinding& operator=(Value const& value) {
        if (mHandle) {
            mHandle->Set(&value);
        } else {
            detail::ThrowUnbound();
        }
        return *this;
    }

private:
    void Release() {
        delete mHandle;
        mHandle = nullptr;
    }

    IParameterBinding* mHandle = nullptr;
};

} // namespace Moka
