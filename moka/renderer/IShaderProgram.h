/// IShaderProgram: a vertex and a fragment stage, compiled and linked. A program whose sources do not compile
/// can be used as well: it can be current, its parameters have an unknown type, and it draws nothing.
/// Owner:  the creator, until Release(). It may outlive its context. If it is made current in a later
///         context, it is compiled there and keeps its values and handles.
/// Thread: render thread.
/// The vtable order is ABI.
#pragma once

namespace Moka {

class IParameterBinding;

class IShaderProgram {
public:
    /// Later draws use this program.
    virtual void MakeCurrent() = 0;

    /// Deletes the object.
    virtual void Release() = 0;

    /// Returns a new handle, which the caller owns. Never null. Its type is BindingTypeUnknown if the linked
    /// program has no uniform of that name, or if the uniform is an array.
    virtual IParameterBinding* GetParameter(char const* name) = 0;

protected:
    ~IShaderProgram() = default;
};

} // namespace Moka
