/// IParameterBinding: a handle on one uniform of a program: sets its value, knows its type.
/// Owner:   the caller of GetParameter; deleting it is the release. It may outlive its program, and then does
///          nothing.
/// Thread:  render thread.
/// Types:   the handle converts from the type it reports: a bool is one byte, an int or a texture unit an
///          int, a vector or a matrix its packed floats (matrices column-major).
/// The vtable order is ABI: Set first, then the destructor.
#pragma once

namespace Moka {

/// The numbers are the interface.
enum BindingType {
    BindingTypeUnknown = 0, ///< nothing of that name, or the compiler removed it: setting does nothing
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
    /// value points to one value of the type; it is copied. Uniforms belong to their program: a value that
    /// is set while another program is current takes effect when this one is. A value equal to the last one
    /// costs no call of the driver.
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
