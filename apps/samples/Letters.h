// Letters.h: the letters of a cursive hand, each the path of a pen in units of the small letters' height: x
// to the right from where the letter begins, y up from the baseline.
#pragma once

#include "apps/samples/Picture.h"

#include <vector>

namespace Moka::Samples {

struct Letter {
    char character;
    float advance;
    std::vector<Spot> body;   // joined to the letters beside it
    std::vector<Spot> accent; // dots and bars, drawn when the word is finished
};

// Null for a character the hand does not know.
Letter const* FindLetter(char character);

} // namespace Moka::Samples
