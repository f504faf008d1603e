#include "moka/renderer/gles/GlVariants.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlDebug.h"
#include "moka/renderer/gles/GlProgramBuilder.h"
#include "moka/renderer/gles/GlState.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace Moka::detail {
namespace {

std::size_t CountIntegers(ProgramLayout const& layout) {
    return (layout.integersEnd - layout.integersBegin) / sizeof(std::int32_t);
}

// Returns Run::varying with the bits of all integers of the program set.
std::uint32_t AllVarying(ProgramLayout const& layout) {
    return static_cast<std::uint32_t>((std::uint64_t{1} << CountIntegers(layout)) - 1);
}

std::int32_t ReadInteger(ProgramLayout const& layout, unsigned char const* values, std::size_t index) {
    std::int32_t value = 0;
    std::memcpy(&value, values + layout.integersBegin + index * sizeof value, sizeof value);
    return value;
}

} // namespace

GlVariants::GlVariants(GlState& state, GlDebug const& debug, char const* label, GlslStages sources,
                       ProgramLayout const& layout)
    : mState(state), mDebug(debug), mLabel(label), mSources(std::move(sources)), mLayout(layout) {}

GlVariants::~GlVariants() {
    for (Variant const& variant : mVariants) {
        if (variant.name == 0) continue;
        // GL keeps a deleted program alive while it is current.
        if (mState.program.Get() == variant.name) mState.program.Set(0);
        Gl::DeleteProgram(variant.name);
        --mState.counters.variants;
    }
}

bool GlVariants::Choose(Run const& run, unsigned char const* values, int* budget, std::size_t* chosen) {
    if (mIsRefused) return false;
    *chosen = Find(run.varying, values);
    Variant& variant = mVariants[*chosen];
    ++variant.sightings;
    bool const pays = run.recordCount >= kLongRun || variant.sightings > 1;
    if (variant.name == 0 && pays && *budget > 0) {
        --*budget;
        Link(variant);
    }
    return variant.name != 0;
}

bool GlVariants::IsFor(Variant const& variant, std::uint32_t varying, unsigned char const* values) const {
    if (variant.varying != varying) return false;
    for (std::size_t i = 0; i < variant.integers.size(); ++i) {
        bool const isConstant = (varying & (1u << i)) == 0;
        if (isConstant && variant.integers[i] != ReadInteger(mLayout, values, i)) return false;
    }
    return true;
}

std::size_t GlVariants::Find(std::uint32_t varying, unsigned char const* values) {
    for (std::size_t i = 0; i < mVariants.size(); ++i) {
        if (IsFor(mVariants[i], varying, values)) return i;
    }
    // The last entry is reserved for the variant without constants.
    std::uint32_t const all = AllVarying(mLayout);
    if (varying != all && mVariants.size() + 1 >= kMost) return Find(all, values);
    Variant variant{};
    variant.varying = varying;
    for (std::size_t i = 0; i < CountIntegers(mLayout); ++i) {
        variant.integers.push_back(ReadInteger(mLayout, values, i));
    }
    mVariants.push_back(std::move(variant));
    return mVariants.size() - 1;
}

void GlVariants::Link(Variant& variant) {
    std::string reason;
    std::optional<GlslStages> const stages =
        MakeGlslVariant({mSources, mLayout, variant.varying, variant.integers}, &reason);
    if (!stages) {
        Refuse(reason);
        return;
    }
    variant.name =
        LinkGlProgram(stages->vertex.c_str(), stages->fragment.c_str(), mSources.vertex.c_str(), &reason);
    if (variant.name == 0) {
        Refuse(reason);
        return;
    }
    ++mState.counters.variants;
    mDebug.Label(GL_PROGRAM_KHR, variant.name, (mLabel + " (merged)").c_str());
    Gl::UniformBlockBinding(variant.name, Gl::GetUniformBlockIndex(variant.name, kRecordBlock), kBinding);
    for (std::size_t const sampler : mLayout.samplers) {
        variant.samplers.push_back(
            Gl::GetUniformLocation(variant.name, mLayout.uniforms[sampler].name.c_str()));
    }
}

void GlVariants::Refuse(std::string const& reason) {
    mIsRefused = true;
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "%s: draws with different values are not merged: %s",
                        mLabel.c_str(), reason.c_str());
}

void GlVariants::Use(std::size_t index, unsigned char const* values) {
    Variant& variant = mVariants[index];
    if (mState.program.Set(variant.name)) ++mState.counters.programSwitches;
    for (std::size_t i = 0; i < variant.samplers.size(); ++i) {
        GLint unit = 0;
        std::memcpy(&unit, values + mLayout.uniforms[mLayout.samplers[i]].offset, sizeof unit);
        if (variant.units[i] == unit) continue;
        variant.units[i] = unit;
        Gl::Uniform1iv(variant.samplers[i], 1, &unit);
    }
}

} // namespace Moka::detail
