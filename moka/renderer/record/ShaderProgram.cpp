#include "moka/renderer/record/ShaderProgram.h"

#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/record/Observer.h"
#include "moka/renderer/record/ProgramState.h"
#include "moka/renderer/record/Recorder.h"

#include <new>
#include <utility>

namespace Moka::detail {
namespace {

constexpr ObjectKind kProgramKind = ObjectKind::kProgram;

void CommitProgram(Recorder& recorder, ProgramState const& program) {
    recorder.CommitAtOnce([&](StateCommit& commit) {
        commit.program = program.GetName();
        commit.values = program.GetValues().data();
    });
}

class ParameterBase : public IParameterBinding {
public:
    ParameterBase(std::shared_ptr<ProgramState> program, void const* object, std::size_t handle)
        : IParameterBinding(program->GetType(handle)),
          mProgram(std::move(program)),
          mObject(object),
          mHandle(handle) {}
    ~ParameterBase() override {
        Observe(kProgramKind, mObject, "ReleaseParameter", mProgram->GetHandleName(mHandle));
    }

protected:
    [[gnu::cold, gnu::noinline]] void ObserveValue(void const* value) const {
        theObserver->OnValue(mObject, mProgram->GetHandleName(mHandle), GetType(), value);
    }

    void CommitIfThrough() const {
        Recorder* const recorder = mProgram->GetRecorder();
        if (recorder && recorder->IsThrough()) CommitValues(*recorder);
    }

    std::shared_ptr<ProgramState> const mProgram;
    void const* const mObject; // identifies the program to the observer; never dereferenced
    std::size_t const mHandle;

private:
    // Values of a program that is not current reach GL when it becomes current. While no target is active,
    // the host may have made its own program current.
    void CommitValues(Recorder& recorder) const {
        bool const isCurrent =
            recorder.IsAttached() && recorder.GetActive() && recorder.requested->GetProgram() == mProgram;
        if (isCurrent && recorder.Begin()) CommitProgram(recorder, *mProgram);
    }
};

// A parameter of one of the types that most draws set, so that Set() needs no switch.
template <BindingType kType>
class Parameter final : public ParameterBase {
public:
    using ParameterBase::ParameterBase;
    void Set(void const* value) override {
        if (theObserver) ObserveValue(value);
        if (mProgram->SetAs<kType>(mHandle, value)) CommitIfThrough();
    }
};

// A parameter of any other type, or of a type that is unknown until the program is built.
class AnyParameter final : public ParameterBase {
public:
    using ParameterBase::ParameterBase;
    void Set(void const* value) override {
        if (theObserver) ObserveValue(value);
        if (mProgram->Set(mHandle, value)) CommitIfThrough();
    }
};

IParameterBinding* MakeParameter(std::shared_ptr<ProgramState> const& program, void const* object,
                                 std::size_t handle) {
    switch (program->GetType(handle)) {
    case BindingTypeMatrix4:
        return new Parameter<BindingTypeMatrix4>(program, object, handle);
    case BindingTypeVector2:
        return new Parameter<BindingTypeVector2>(program, object, handle);
    case BindingTypeVector4:
        return new Parameter<BindingTypeVector4>(program, object, handle);
    case BindingTypeFloat:
        return new Parameter<BindingTypeFloat>(program, object, handle);
    case BindingTypeInt:
        return new Parameter<BindingTypeInt>(program, object, handle);
    default:
        return new AnyParameter(program, object, handle);
    }
}

// The parameter that is returned if memory runs out. It has no state, so one static object serves all
// callers.
class InertParameter final : public IParameterBinding {
public:
    static IParameterBinding* Get() {
        alignas(InertParameter) static unsigned char memory[sizeof(InertParameter)];
        return ::new (memory) InertParameter;
    }
    void Set(void const*) override {}
    static void operator delete(void*) {}

private:
    InertParameter() : IParameterBinding(BindingTypeUnknown) {}
};

class InertProgram final : public IShaderProgram {
public:
    void MakeCurrent() override {
        Recorder* const recorder = GetAttachedRecorder();
        if (recorder && recorder->Begin()) recorder->requested->SetProgram(nullptr);
    }
    void Release() override {}
    IParameterBinding* GetParameter(char const*) override { return InertParameter::Get(); }
};

} // namespace

ShaderProgram::ShaderProgram(std::shared_ptr<ProgramState> state) : mState(std::move(state)) {}

IShaderProgram* ShaderProgram::GetInert() {
    static InertProgram program;
    return &program;
}

void ShaderProgram::MakeCurrent() {
    IShaderProgram* const self = this;
    if (theObserver) Observe(kProgramKind, self, "MakeCurrent");
    Recorder* const recorder = GetAttachedRecorder();
    if (MOKA_UNLIKELY(!recorder || !recorder->Begin())) return;
    if (MOKA_UNLIKELY(mState->GetRecorder() != recorder)) {
        try {
            mState->BuildIn(recorder->shared_from_this());
        } catch (std::bad_alloc const&) {
            // Draws with this program then do nothing.
        }
    }
    recorder->requested->SetProgram(mState);
    CommitProgram(*recorder, *mState);
}

void ShaderProgram::Release() {
    IShaderProgram* const self = this;
    Observe(kProgramKind, self, "Release");
    mState->Release();
    delete this;
}

IParameterBinding* ShaderProgram::GetParameter(char const* name) {
    IShaderProgram* const self = this;
    try {
        std::size_t const handle = mState->AddHandle(name);
        IParameterBinding* const parameter = MakeParameter(mState, self, handle);
        Observe(kProgramKind, self, "GetParameter", name ? name : "null", parameter->GetType());
        return parameter;
    } catch (std::bad_alloc const&) {
        return InertParameter::Get();
    }
}

} // namespace Moka::detail
