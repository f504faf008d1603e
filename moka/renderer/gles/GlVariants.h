// GlVariants: the variants of one program (GlslVariant.h), each linked when it pays.
// A long run links its variant at once, a short one when it is seen again. Integers that a run does not vary are
// constants, so a program has a variant for each of their values, up to a limit; then one that varies them all.
// Owner:  GlPrograms, with the program.
// Thread: render thread.
// Fails:  a program whose text is not understood or whose variant does not link has none, which is logged once.
#pragma once

#include "moka/renderer/device/DrawList.h"
#include "moka/renderer/gles/GlFunctions.h"
#include "moka/renderer/gles/GlslVariant.h"

#include <vector>

namespace Moka::detail {

class GlDebug;
class GlState;

class GlVariants {
public:
    // The uniform buffer binding that variants read; the last one that every device has.
    static constexpr GLuint kBinding = 23;

    GlVariants(GlState& state, GlDebug const& debug, char const* label, GlslStages sources,
               ProgramLayout const& layout);
    ~GlVariants();
    GlVariants(GlVariants const&) = delete;
    GlVariants& operator=(GlVariants const&) = delete;

    ProgramLayout const& GetLayout() const { return mLayout; }
    // The number of the variant for a run of more than one record; false to draw them one by one. values are the
    // first record's. Links only while *budget is above 0.
    bool Choose(Run const& run, unsigned char const* values, int* budget, std::size_t* variant);
    // Makes it current. values are any record's, for the texture units.
    void Use(std::size_t variant, unsigned char const* values);

private:
    static constexpr std::size_t kMost = 16;
    static constexpr std::size_t kLongRun = 32;

    struct Variant {
        std::uint32_t varying;
        std::vector<std::int32_t> integers; // of use where they do not vary
        int sightings;
        GLuint name;                           // 0 until it is linked
        std::vector<GLint> samplers;           // locations, in the program's order
        std::array<GLint, kMaxSamplers> units; // that GL has for them
    };

    bool IsFor(Variant const& variant, std::uint32_t varying, unsigned char const* values) const;
    std::size_t Find(std::uint32_t varying, unsigned char const* values);
    void Link(Variant& variant);
    void Refuse(std::string const& reason);

    GlState& mState;
    GlDebug const& mDebug;
    std::string const mLabel;
    GlslStages const mSources;
    ProgramLayout const mLayout;
    bool mIsRefused = false;
    std::vector<Variant> mVariants;
};

} // namespace Moka::detail
