/// IShaderProgram: a vertex and a fragment stage, compiled and linked. One whose sources do not compile is an
/// object like any other: it can be current, its parameters are of unknown type, and it draws nothing.
/// Owner:  the creator, until Release(). It outlives its context: made current in a later one, it is
///         compiled there, with the values and handles that it has.
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

    /// A new handle, which the caller owns. Never null: for a name that the linked program does not have, its
    /// type is BindingTypeUnknown. Arrays are not handed out.
    virtual IParameterBinding* GetParameter(char const* name) = 0;

protected:
    ~IShaderProgram() = default;
};

} // namespace Moka
