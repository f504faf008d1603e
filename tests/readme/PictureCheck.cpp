// Checks the picture that the README's program draws: PictureCheck PICTURE.
// A square of 280 turned by 30 degrees about (200, 200), and a disc of radius 60 around the middle of its
// right side, both cut by a clip that is turned with them and ends at that side. A pixel's place in the
// square's own coordinates, from its centre, is u = 0.866 dx + 0.5 dy, v = 0.866 dy - 0.5 dx.
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <cstdio>
#include <cstdlib>
#include <memory>

namespace {

struct Color {
    int r, g, b;
};

constexpr Color kPaper{41, 74, 107};
constexpr Color kSquare{255, 255, 255};
constexpr Color kDisc{217, 77, 51};

struct Expected {
    int x, y;
    Color color;
    char const* what;
};

constexpr Expected kExpected[] = {
    {200, 200, kSquare, "the middle"},
    {87, 135, kSquare, "u = -130, inside the left side"},
    {70, 125, kPaper, "u = -150, left of the square, within the clip"},
    {247, 377, kSquare, "u = v = 130, the lower corner"},
    {152, 22, kSquare, "u = v = -130, the upper corner"},
    {247, 22, kPaper, "where the upper corner would be turned the other way"},
    {330, 70, kPaper, "where a corner would be if nothing turned"},
    {286, 250, kDisc, "u = 100, the disc within the clip"},
    {347, 285, kPaper, "u = 170, the disc beyond the clip"},
    {0, 0, kPaper, "the first pixel"},
    {399, 399, kPaper, "the last pixel"},
};

bool IsNear(int a, int b) { return std::abs(a - b) <= 1; }

bool IsAsExpected(unsigned char const* pixel, Color const& color) {
    return IsNear(pixel[0], color.r) && IsNear(pixel[1], color.g) && IsNear(pixel[2], color.b) &&
           pixel[3] == 255;
}

} // namespace

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    Moka::String const path(argv[1]);
    std::unique_ptr<Moka::Bitmap> const picture(Moka::BitmapFactory::CreateBitmapForGraphics(&path));
    if (!picture || picture->GetWidth() != 400 || picture->GetHeight() != 400) {
        std::fprintf(stderr, "%s is no picture of 400 x 400\n", argv[1]);
        return 1;
    }
    int wrong = 0;
    for (Expected const& e : kExpected) {
        auto const* const pixel =
            static_cast<unsigned char const*>(picture->GetBuffer()) + e.y * picture->GetStride() + e.x * 4;
        if (IsAsExpected(pixel, e.color)) continue;
        std::fprintf(stderr, "(%d, %d), %s: %d %d %d %d\n", e.x, e.y, e.what, pixel[0], pixel[1], pixel[2],
                     pixel[3]);
        ++wrong;
    }
    return wrong == 0 ? 0 : 1;
}
