// GlUniforms: a linked GL program and the values of its uniforms, shared by the program object and the
// handles it gave out.
// Owner:   shared; the program object deletes the GL name, and what is left is inert.
// Thread:  render thread.
// A value is kept here too: GL sets uniforms of the current program only, and what is set already is not sent
// again.
#pragma once

#include "moka/renderer/IParameterBinding.h"

#include <GLES3/gl3.h>

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

    void MakeCurrent();
    void DeleteProgram();

private:
    static constexpr int kMaxSize = 64; // bytes; a 4 x 4 matrix

    struct Uniform {
        std::string name;
        GLint location;
        BindingType type;
        bool isSent = true;
        // As GL takes it. Linking sets every uniform to zero.
        alignas(GLfloat) unsigned char value[kMaxSize] = {};
    };

    void AddUniform(GLuint index, char const* programName);
    static void Send(Uniform& uniform);
    void SendWaiting();

    std::shared_ptr<GlContext> const mContext;
    GLuint mProgram;
    std::vector<Uniform> mUniforms;
    bool mHasWaiting = false; // values that were set while another program was current
};

} // namespace Moka::detail
