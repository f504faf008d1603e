// SceneText.h: JSON text as a tree in which every value knows its place.
// Fails: throws SceneTextError on what is no JSON, a key given twice, numbers that are not finite in single
//        precision, and on more than the limits below.
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

    // For a message: the value itself where it is short.
    std::string Describe() const;

    Kind kind = Kind::Null;
    int line = 0; // of its first character, both from 1; a column is a character
    int column = 0;
    double number = 0; // of a boolean, 0 or 1
    std::string text;
    std::vector<std::string> keys; // of an object, one for each item
    std::vector<SceneValue> items; // of a list or an object
};

SceneValue ParseSceneText(std::string_view text);

// The way from root to a value in its tree: "operations[3].DrawRect.rect"; "the scene" for root itself.
std::string FindPath(SceneValue const& root, SceneValue const& value);

} // namespace Moka::Scenes
