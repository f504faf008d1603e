// GlPrograms: linked programs, each with the uniform values that GL has, so that only changed values are
// sent.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/ProgramLayout.h"
#include "moka/renderer/gles/GlFunctions.h"
#include "moka/renderer/gles/GlVariants.h"

#include <memory>
#include <unordered_map>
#include <vector>

namespace Moka::detail {

class GlState;

class GlPrograms {
public:
    GlPrograms(GlState& state, GlDebug const& debug) : mState(state), mDebug(debug) {}

    // Reads the program's uniforms into *layout. Logs uniforms of unsupported types by name and leaves them
    // out.
    void Add(GLuint program, GlslStages sources, char const* label, ProgramLayout* layout);
    void Delete(GLuint program);

    // Makes the program current, with these values. A program that failed to link has no values.
    void Apply(GLuint program, unsigned char const* values);
    // Null for a program that failed to link.
    GlVariants* GetVariants(GLuint program);

private:
    struct Program {
        ProgramLayout layout;
        std::vector<GLint> locations; // by uniform
        std::vector<unsigned char> sent;
        std::unique_ptr<GlVariants> variants;
    };

    static void AddUniform(GLuint name, GLuint index, char const* label, Program& program);
    Program* Find(GLuint program);
    void Send(Program& program, std::size_t uniform, unsigned char const* values);

    GlState& mState;
    GlDebug const& mDebug;
    std::unordered_map<GLuint, Program> mPrograms;
    // The program applied last. In most cases the next draw uses it as well, which saves the look-up.
    GLuint mLastName = 0;
    Program* mLast = nullptr;
};

} // namespace Moka::detail
