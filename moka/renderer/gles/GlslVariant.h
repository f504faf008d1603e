// GlslVariant.h: rewrites the text of a program so that its uniforms become values that differ from vertex to
// vertex: the vertex stage reads them from an array of records in a uniform block, by a number that each vertex
// has, and hands the uniforms of the fragment stage on as flat inputs. Samplers stay uniforms. No GL is needed.
//
//     uniform highp float uRadius;    becomes, in the fragment stage,
//     flat in highp float moka_uRadius; highp float uRadius;
//
// and a new main() copies the one to the other before it calls the program's own. So names that hide a uniform
// keep hiding it.
#pragma once

#include "moka/renderer/device/ProgramLayout.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace Moka::detail {

inline constexpr char kRecordBlock[] = "MokaRecords";
// Of the vertices' numbers; the last one that every device has.
inline constexpr unsigned kRecordLocation = 15;
// Bytes of the block that every device has room for.
inline constexpr std::size_t kBlockBytes = std::size_t{16} * 1024;
// Vectors from stage to stage that every device has room for.
inline constexpr int kMostVaryings = 15;

struct GlslStages {
    std::string vertex;
    std::string fragment;
};

struct GlslVariantRequest {
    GlslStages const& sources; // GLSL ES 1.00 or 3.00
    ProgramLayout const& layout;
    std::uint32_t varying; // as Run has it
    // Of all ints and bools, in the order of their offsets. Those that do not vary become constants.
    std::vector<std::int32_t> const& integers;
};

// The text with highp in place of lower precisions.
std::string MakeGlslHighp(std::string_view source);

// Bytes from one record to the next: std140 of the program's values up to the texture units.
std::size_t GetRecordStride(ProgramLayout const& layout);
std::size_t GetRecordsPerBlock(ProgramLayout const& layout);

// GLSL ES 3.00. Nothing, with the reason, for a text that is not understood well enough.
std::optional<GlslStages> MakeGlslVariant(GlslVariantRequest const& request, std::string* reason);

} // namespace Moka::detail
