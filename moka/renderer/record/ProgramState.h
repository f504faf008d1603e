// ProgramState: a program's sources, its device program, and the values of its uniforms. The program object
// and its parameter bindings share it.
// A program belongs to the context that it was built in. If it is used in another context, it is built again
// there; its bindings stay valid and its values are kept.
// Owner:   shared. Releasing the program object deletes the device program; the bindings then do nothing.
// Thread:  render thread. Release() may run on any thread.
#pragma once

#include "moka/base/Likely.h"
#include "moka/renderer/device/ProgramLayout.h"
#include "moka/renderer/record/UniformValue.h"

#include <cstdint>
#include <memory>

namespace Moka::detail {

class Recorder;

class ProgramState {
public:
    // Builds the program if recorder is not null. Copies the texts.
    ProgramState(std::shared_ptr<Recorder> const& recorder, char const* vertexSource,
                 char const* fragmentSource, char const* label);

    // Call this within a request. Builds the program in recorder's context, to which it belongs from then on.
    // Returns false if the program was released or the driver could not create it.
    bool BuildIn(std::shared_ptr<Recorder> const& recorder);
    // The recorder of the context that the program was built in; null before the first build.
    Recorder* GetRecorder() const { return mRecorder.get(); }
    // Deletes the device program. BuildIn() fails from then on.
    void Release();

    // Returns the index of the handle for the parameter. Equal names have equal indices.
    std::size_t AddHandle(char const* name);
    BindingType GetType(std::size_t handle) const;
    char const* GetHandleName(std::size_t handle) const { return mHandles[handle].name.c_str(); }
    // Returns true if the value changed.
    bool Set(std::size_t handle, void const* value);
    // Like Set(), for a handle of type kType. If the handle has another type now, it does nothing and returns
    // false.
    template <BindingType kType>
    bool SetAs(std::size_t handle, void const* value) {
        Handle const& place = mHandles[handle];
        if (MOKA_UNLIKELY(mIsReleased || place.type != kType)) return false;
        if (MOKA_LIKELY(!ReplaceValue<kType>(mValues.data() + place.offset, value))) return false;
        listed.isStale = true;
        return true;
    }

    bool CanDraw() const { return mName != 0 && mLayout.draws; }
    DeviceName GetName() const { return mName; }
    char const* GetLabel() const { return mLabel.c_str(); }
    ProgramLayout const& GetLayout() const { return mLayout; }
    std::size_t GetSamplerCount() const { return mLayout.samplers.size(); }
    // The texture unit that the sampler is set to.
    int GetSamplerUnit(std::size_t sampler) const;

    // All values at the offsets of ProgramLayout.
    std::vector<unsigned char> const& GetValues() const { return mValues; }

    // The latest copy of the values in a draw list.
    struct Listed {
        std::uint64_t list = 0; // the number of the list
        std::size_t offset = 0;
        bool isStale = false; // a value has changed since the copy
    };
    Listed listed;

private:
    struct Handle {
        std::string name;
        BindingType type;   // BindingTypeUnknown: the program has no such uniform
        std::size_t offset; // of its value in mValues, in bytes
    };

    static Handle Resolve(std::string const& name, ProgramLayout const& layout);

    static ProgramLayout::Uniform const* Find(ProgramLayout const& layout, std::string const& name);
    void CopyValues(ProgramLayout const& layout, std::vector<unsigned char>& values) const;

    std::shared_ptr<Recorder> mRecorder; // null before the first build
    std::string const mVertexSource;
    std::string const mFragmentSource;
    std::string const mLabel;
    DeviceName mName = 0;
    bool mIsReleased = false;
    ProgramLayout mLayout;
    std::vector<unsigned char> mValues; // initially zero, as GL sets uniforms when it links
    std::vector<Handle> mHandles;
};

} // namespace Moka::detail
