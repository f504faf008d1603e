#include "moka/graphics/drawable/ParameterBinding.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/drawable/ShaderExceptions.h"
#include "moka/renderer/IShaderProgram.h"

#include <memory>

namespace Moka {

InvalidArgumentException::~InvalidArgumentException() = default;
NotSupportedException::~NotSupportedException() = default;

namespace detail {
namespace {

template <class Exception>
[[noreturn]] void Throw(char const* message) {
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s", message);
    throw Exception(message);
}

} // namespace

IParameterBinding* LookUpParameter(IShaderProgram* program, char const* name, BindingType wanted) {
    std::unique_ptr<IParameterBinding> handle(program->GetParameter(name));
    BindingType const found = handle->GetType();
    if (found == wanted || found == BindingTypeUnknown) return handle.release();
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "%s: Found %d but given %d", name, found, wanted);
    handle.reset();
    Throw<InvalidArgumentException>("ParameterBinding<>::bind - invalid parameter type!");
}

void ThrowUnbound() {
    Throw<NotSupportedException>("ParameterBinding: internal interface is not initialized!");
}

} // namespace detail
} // namespace Moka
