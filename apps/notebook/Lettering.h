// Lettering: draws text as lines, for labels, messages and icons. Icons are characters of this font as well. The font
// has ASCII only; any other character is drawn as '?'.
#pragma once

#include "moka/graphics/canvas/IMKCanvas.h"

#include <string_view>

namespace Moka::Notebook {

constexpr float kLetterHeight = 8; // grid cells from the top of a capital to the lowest descender
constexpr float kIconSide = 9;
// The icons of the tools, by the number of the tool.
constexpr char const* kToolIcons[] = {"\1", "\2", "\3", "\4", "\5"};
constexpr char kUndoIcon[] = "\6";
constexpr char kRedoIcon[] = "\7";

// unit is the side of a grid cell in canvas pixels. (x, y) is the top left corner of the text.
void DrawLetters(IMKCanvas& canvas, std::string_view text, float x, float y, float unit, unsigned argb);
float MeasureLetters(std::string_view text, float unit);

} // namespace Moka::Notebook
