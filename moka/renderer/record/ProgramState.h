// ProgramState: the sources of a program, what the device made of them, and the values of its uniforms; shared
// by the program object and the handles on its parameters.
// A program belongs to the context that it was built in. Used in another one, it is built there anew; its
// handles keep working and its values are kept.
// Owner:   shared; releasing the program object deletes the device's program, and what is left is inert.
// Thread:  render thread; releasing is tolerated elsewhere.
#pragma once

#include "moka/renderer/device/ProgramLayout.h"
#include "moka/renderer/record/UniformValue.h"

#include <cstdint>
#include <memory>

namespace Moka::detail {

class Recorder;

class ProgramState {
public:
    // Builds nothing without a recorder. Texts are copied.
    ProgramState(std::shared_ptr<Recorder> const& recorder, char const* vertexSource,
                 char const* fragmentSource, char const* label);

    // Within a request: belongs to recorder from now on. False: released, or the driver made no program.
    bool BuildIn(std::shared_ptr<Recorder> const& recorder);
    // Of the context that it was built in; null before.
    Recorder* GetRecorder() const { return mRecorder.get(); }
    // Deletes the device's program; nothing builds it again.
    void Release();

    // The number of a handle on the parameter; the same name always has the same.
    std::size_t AddHandle(char const* name);
    BindingType GetType(std::size_t handle) const;
    char const* GetHandleName(std::size_t handle) const { return mHandles[handle].name.c_str(); }
    // Whether the program's values changed.
    bool Set(std::size_t handle, void const* value);
    // The same for a handle of that type; one that has another type now is left alone.
    template <BindingType kType>
    bool SetAs(std::size_t handle, void const* value) {
        Handle const& place = mHandles[handle];
        if (mIsReleased || place.type != kType) return false;
        if (!ReplaceValue<kType>(mValues.data() + place.offset, value)) return false;
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

    // All values, as ProgramLayout places them.
    std::vector<unsigned char> const& GetValues() const { return mValues; }

    // What the draw list has of this program.
    struct Listed {
        std::uint64_t list = 0;
        std::size_t offset = 0; // of the values copied last
        bool isStale = false;   // a value was set since
    };
    Listed listed;

private:
    struct Handle {
        std::string name;
        BindingType type;   // BindingTypeUnknown: the program has no such uniform
        std::size_t offset; // of its value
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
    std::vector<unsigned char> mValues; // linking sets every uniform to zero
    std::vector<Handle> mHandles;
};

} // namespace Moka::detail
