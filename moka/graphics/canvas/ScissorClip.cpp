#include "moka/graphics/canvas/ScissorClip.h"

#include "moka/base/Saturate.h"

#include <algorithm>
#include <cstdint>

namespace Moka::detail {
namespace {

// 64 bits, because an edge is a sum of several 32-bit integers.
struct Edges {
    std::int64_t left;
    std::int64_t bottom;
    std::int64_t right;
    std::int64_t top;
};

bool IsReplace(ClipInfo const& clip) { return clip.op == IMKCanvasBase::Replace; }

// Compat: rotation-test
bool IsUpright(ClipInfo const& clip) { return clip.matrix[3] == 0; }

// Clamps to a range that exceeds every target. The difference of two such edges still fits an int.
int ToEdge(std::int64_t value) {
    constexpr std::int64_t kFar = std::int64_t{1} << 30;
    return static_cast<int>(std::clamp(value, -kFar, kFar - 1));
}

// Compat: scissor-rounding
Edges GetEdges(ClipInfo const& clip, int targetY, int targetHeight) {
    float const sx = clip.matrix[0];
    float const sy = clip.matrix[4];
    float const tx = clip.matrix[6];
    float const ty = clip.matrix[7];
    int const height = Saturate(sy * static_cast<float>(clip.height));
    Edges edges{};
    edges.left = Saturate(sx * static_cast<float>(clip.x) + tx);
    edges.right = edges.left + Saturate(sx * static_cast<float>(clip.width));
    edges.bottom = Saturate(static_cast<float>(targetHeight) -
                            (sy * static_cast<float>(clip.y) + ty + static_cast<float>(height)) +
                            static_cast<float>(targetY));
    edges.top = edges.bottom + height;
    return edges;
}

} // namespace

bool HasReplace(ClipList const& clips) { return std::any_of(clips.begin(), clips.end(), IsReplace); }

std::size_t FirstRelevant(ClipList const& clips) {
    for (std::size_t i = clips.size(); i-- > 0;)
        if (IsReplace(clips[i])) return i;
    return 0;
}

bool IsScissorEnough(ClipList const& clips) {
    if (clips.size() == 1) return IsUpright(clips.front()); // Compat: single-clip
    if (IsReplace(clips.back()) && IsUpright(clips.back())) return true;
    return std::all_of(clips.begin(), clips.end(), [](ClipInfo const& clip) {
        return (clip.op == IMKCanvasBase::Intersect || IsReplace(clip)) && IsUpright(clip);
    });
}

ScissorRect GetScissorRect(ClipList const& clips, int targetY, int targetHeight) {
    std::size_t const first = FirstRelevant(clips);
    Edges all = GetEdges(clips[first], targetY, targetHeight);
    for (std::size_t i = first + 1; i < clips.size(); ++i) {
        Edges const edges = GetEdges(clips[i], targetY, targetHeight);
        all.left = std::max(all.left, edges.left);
        all.bottom = std::max(all.bottom, edges.bottom);
        all.right = std::min(all.right, edges.right);
        all.top = std::min(all.top, edges.top);
    }
    if (all.right <= all.left || all.top <= all.bottom) return {};
    int const left = ToEdge(all.left);
    int const bottom = ToEdge(all.bottom);
    return {left, bottom, ToEdge(all.right) - left, ToEdge(all.top) - bottom};
}

ScissorRect ToStrip(ScissorRect const& rect, int targetHeight, int frameLeft, int frameTop) {
    return {Saturate(std::int64_t{rect.x} - frameLeft),
            Saturate(std::int64_t{targetHeight} - frameTop - rect.y - rect.height), rect.width, rect.height};
}

} // namespace Moka::detail
