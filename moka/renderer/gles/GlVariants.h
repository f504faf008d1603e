// GlVariants: the variants of one program (GlslVariant.h). A variant is linked when it is likely to save
// time: for a long run at once, for a short run when it occurs again.
// Integers that do not vary in a run are constants of its variant. So a program has a variant for each
// combination of their values, up to a limit. Beyond it, one variant reads all integers from the records.
// Owner:  GlPrograms, with the program.
// Thread: render thread.
// Fails:  if the source cannot be rewritten or a variant does not link, the program has no variants. This is
//         logged once.
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
    // The uniform buffer binding of the records: the last one that every OpenGL ES 3.0 device has.
    static constexpr GLuint kBinding = 23;

    GlVariants(GlState& state, GlDebug const& debug, char const* label, GlslStages sources,
               ProgramLayout const& layout);
    ~GlVariants();
    GlVariants(GlVariants const&) = delete;
    GlVariants& operator=(GlVariants const&) = delete;

    ProgramLayout const& GetLayout() const { return mLayout; }
    // Sets *variant to the index of the variant for a run of several records. Returns false if the records
    // must be drawn one by one. values are those of the first record. Links only while *budget is above 0.
    bool Choose(Run const& run, unsigned char const* values, int* budget, std::size_t* variant);
    // Makes the variant current. values are those of any record of the run; they supply the texture units.
    void Use(std::size_t variant, unsigned char const* values);

private:
    static constexpr std::size_t kMost = 16;
    static constexpr std::size_t kLongRun = 32;

    struct Variant {
        std::uint32_t varying;
        std::vector<std::int32_t> integers; // the constants; ignored where they vary
        int sightings;
        GLuint name;                           // 0 until it is linked
        std::vector<GLint> samplers;           // locations, in the program's order
        std::array<GLint, kMaxSamplers> units; // the texture units that GL has for them
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
