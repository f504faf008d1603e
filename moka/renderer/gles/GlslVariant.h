// GlslVariant.h: rewrites the source of a program so that its uniforms may differ between vertices. The
// vertex stage reads them from an array of records in a uniform block, indexed by a number of the vertex. It
// passes the uniforms of the fragment stage on as flat varyings. Samplers stay uniforms. This file needs no
// GL.
//
//     uniform highp float uRadius;    becomes, in the fragment stage,
//     flat in highp float moka_uRadius; highp float uRadius;
//
// and a new main() copies the varying to the variable before it calls the program's own main(). Local names
// that hide a uniform therefore keep hiding it.
#pragma once

#include "moka/renderer/device/ProgramLayout.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace Moka::detail {

inline constexpr char kRecordBlock[] = "MokaRecords";
// The attribute location of the record number: the last one that every OpenGL ES 3.0 device has.
inline constexpr unsigned kRecordLocation = 15;
// The size of a uniform block that every device supports.
inline constexpr std::size_t kBlockBytes = std::size_t{16} * 1024;
// The number of varying vectors that every device supports.
inline constexpr int kMostVaryings = 15;

struct GlslStages {
    std::string vertex;
    std::string fragment;
};

struct GlslVariantRequest {
    GlslStages const& sources; // GLSL ES 1.00 or 3.00
    ProgramLayout const& layout;
    std::uint32_t varying; // Run::varying
    // The values of all ints and bools, in the order of their offsets. Those that do not vary become
    // constants.
    std::vector<std::int32_t> const& integers;
};

// Returns the source with lower precisions replaced by highp.
std::string MakeGlslHighp(std::string_view source);

// The bytes from one record to the next: the std140 size of the program's values without the texture units.
std::size_t GetRecordStride(ProgramLayout const& layout);
std::size_t GetRecordsPerBlock(ProgramLayout const& layout);

// Returns the variant in GLSL ES 3.00. If a source contains something that this file cannot rewrite, returns
// nothing and sets *reason.
std::optional<GlslStages> MakeGlslVariant(GlslVariantRequest const& request, std::string* reason);

} // namespace Moka::detail
