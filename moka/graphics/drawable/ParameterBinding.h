// ParameterBinding: sets a uniform of a program by assignment: shader->uColor = paint.GetColor().
// Owner:  owns the renderer's handle.
// Thread: render thread.
// Fails:  throws if it is bound to a uniform of another type, or assigned to while unbound.
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

// The type-independent part. LookUpParameter releases the handle before it throws.
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

    // Binds to a uniform. If the program has no such uniform, or the compiler removed it, assigned values are
    // ignored. If the uniform has another type, throws InvalidArgumentException and stays unbound.
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
