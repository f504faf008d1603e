/// IParameterBinding: a handle for one uniform of a program. It sets the value and reports the type.
/// Owner:   the caller of GetParameter, who deletes it. It may outlive its program; Set then does nothing.
/// Thread:  render thread.
/// Types:   the handle converts from the type it reports: a bool is one byte, an int or a texture unit an
///          int, a vector or a matrix its packed floats (matrices column-major).
/// The vtable order is ABI: Set first, then the destructor.
#pragma once

namespace Moka {

/// The numbers are the interface.
enum BindingType {
    BindingTypeUnknown = 0, ///< the program has no such uniform, or the compiler removed it: Set does nothing
    BindingTypeBool = 1,
    BindingTypeMatrix4 = 2,
    BindingTypeVector2 = 3,
    BindingTypeVector4 = 5,
    BindingTypeFloat = 6,
    BindingTypeInt = 7,
    BindingTypeTextureUnit = 8,
};

class IParameterBinding {
public:
    /// Copies one value of the uniform's type. The program need not be current: the value holds for its later
    /// draws. Setting an equal value again makes no GL call.
    virtual void Set(void const* value) = 0;
    virtual ~IParameterBinding() = default;

    /// The type of the uniform.
    BindingType const& GetType() const { return mType; }

protected:
    /// A handle on a uniform of this type.
    explicit IParameterBinding(BindingType type) : mType(type) {}

private:
    BindingType const mType;
};

} // namespace Moka
