// SceneText.h: reads JSON text as a tree of values with their positions.
// Fails: throws SceneTextError for invalid JSON, duplicate keys, numbers that are not finite in single
//        precision, and beyond the limits below.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace Moka::Scenes {

constexpr int kMaxNesting = 64;
constexpr std::size_t kMaxValues = 4'000'000;

struct SceneValue {
    enum class Kind { Null, Boolean, Number, Text, List, Object };

    // Returns a description for messages: the value itself if it is short.
    std::string Describe() const;

    Kind kind = Kind::Null;
    int line = 0; // of its first character; both count from 1, and columns are characters
    int column = 0;
    double number = 0; // of a boolean, 0 or 1
    std::string text;
    std::vector<std::string> keys; // of an object, one for each item
    std::vector<SceneValue> items; // of a list or an object
};

SceneValue ParseSceneText(std::string_view text);

// Returns the path from root to a value in its tree: "operations[3].DrawRect.rect". For root itself, "the
// scene".
std::string FindPath(SceneValue const& root, SceneValue const& value);

} // namespace Moka::Scenes
