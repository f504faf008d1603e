// GlUniforms: a linked GL program and the values of its uniforms, shared by the program object, the handles
// it gave out, and the draw list.
// Owner:   shared; the program object deletes the GL name, and what is left is inert.
// Thread:  render thread.
// The values are kept here: a draw takes those down that are set when it is asked for, and what GL has
// already is not sent again.
#pragma once

#include "moka/renderer/IParameterBinding.h"

#include <GLES3/gl3.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace Moka::detail {

class GlContext;

class GlUniforms {
public:
    // A null context, or the program 0, makes one that is inert from the start. name is for messages.
    GlUniforms(std::shared_ptr<GlContext> context, GLuint program, char const* name);

    // -1 when there is none of that name.
    int Find(char const* name) const;
    // Unknown for an index of -1.
    BindingType GetType(int index) const;
    void Set(int index, void const* value);

    // False for one that draws nothing: it did not compile, or it was deleted.
    bool CanDraw() const { return mProgram != 0 && !mIsPlaceholder; }
    // Its sources did not compile, and something that compiles stands in their place.
    void SetPlaceholder() { mIsPlaceholder = true; }
    int GetSamplerCount() const { return static_cast<int>(mSamplers.size()); }
    // The unit that the sampler is set to.
    int GetSamplerUnit(int sampler) const;

    // All values as GL takes them, GetSize() bytes.
    unsigned char const* GetValues() const { return mValues.data(); }
    std::size_t GetSize() const { return mValues.size(); }

    // What the draw list knows of this program.
    struct Listed {
        std::uint64_t list = 0;
        std::size_t offset = 0; // of the values taken down last
        bool isStale = false;   // something was set since
    };
    Listed listed;

    // Within an operation: makes it GL's current program, with these values.
    void PutInForce(unsigned char const* values);

    // Its context was detached: nothing of it is left in GL.
    bool HasLostContext() const;
    // The same program, linked anew in another context: handles and values stay.
    void MoveTo(std::shared_ptr<GlContext> context, GLuint program);

    void MakeCurrent(std::shared_ptr<GlUniforms> const& self);
    void DeleteProgram();

private:
    struct Uniform {
        std::string name;
        GLint location;
        BindingType type;
        std::size_t offset; // in the values
    };

    void AddUniform(GLuint index, char const* programName);
    void Send(Uniform const& uniform, unsigned char const* value);

    std::shared_ptr<GlContext> mContext;
    GLuint mProgram;
    bool mIsPlaceholder = false;
    std::vector<Uniform> mUniforms;
    std::vector<int> mSamplers; // indices of uniforms
    // Linking sets every uniform to zero.
    std::vector<unsigned char> mValues;
    std::vector<unsigned char> mSent;
};

} // namespace Moka::detail
