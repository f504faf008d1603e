// Lettering: text made of lines, for labels and messages, and icons, which are letters too. ASCII; any other character
// is drawn as '?'.
#pragma once

#include "moka/graphics/canvas/IMKCanvas.h"

#include <string_view>

namespace Moka::Notebook {

constexpr float kLetterHeight = 8; // grid units from the top of a capital to the lowest tail
constexpr float kIconSide = 9;
// Of a tool: the letter at its number.
constexpr char const* kToolIcons[] = {"\1", "\2", "\3", "\4", "\5"};
constexpr char kUndoIcon[] = "\6";
constexpr char kRedoIcon[] = "\7";

// unit is the side of the grid's cells in canvas pixels. (x, y) is the top left corner.
void DrawLetters(IMKCanvas& canvas, std::string_view text, float x, float y, float unit, unsigned argb);
float MeasureLetters(std::string_view text, float unit);

} // namespace Moka::Notebook
