#include "apps/notebook/Lettering.h"

#include "moka/graphics/paint/MKPaint.h"

#include <algorithm>

namespace Moka::Notebook {
namespace {

constexpr float kAdvance = 6;
constexpr float kThickness = 0.8f;

// From ' ' to '~', then the icons. Two digits are a point, column and row of a grid of 5 by 9, of 10 by 10 for icons;
// '|' begins another line, a space another glyph. Capitals stand on row 6.
constexpr char kGlyphs[] =
    " 2024|2526 1012|3032 1016|3036|0242|0444 413010010213334445361605|2026 4006|0010110100|3545463635 "
    "4612112031320405162644 2022 30212536 10212516 2125|1234|3214 2125|0343 2517 1333 2526 4006 "
    "103041453616050110 112026|1636 01103041420646 004022334445361605 36300444 400002324345361605 "
    "413010010516364544331304 004016 13020110304142331304051636454433 051636454130100102133342 2223|2526 "
    "2223|2517 310335 0242|0444 114315 01103041422324|2526 343212144441301001051636 062046|1434 "
    "06003041423303|3344453606 4130100105163645 06003041453606 40000646|0333 400006|0333 "
    "41301001051636454323 0006|4046|0343 1030|2026|1636 4045361605 0006|400346 000646 0600234046 "
    "06004640 103041453616050110 06003041423303 103041453616050110|2446 06003041423303|2346 "
    "413010010213334445361605 0040|2026 000516364540 002640 0016233640 0046|4006 002340|2326 00400646 "
    "30202636 0046 10202616 122032 0747 1021 4246|4332120305163645 0006|0312324345361605 "
    "4332120305163645 4046|4332120305163645 04444332120305163645 40302126|1242 "
    "4247381807|4332120305163645 0006|0312324346 2226|2021 32372818|3031 0006|420446 202536 "
    "0206|03122326|23324346 0206|0312324346 123243453616050312 0208|0312324345361605 "
    "4248|4332120305163645 0206|03123243 4212031434453606 20253646|1242 0205163645|4246 022642 "
    "0216243642 0246|4206 0226|4218 02420646 30212213242536 2027 10212233242516 04133443 "
    "091670923809|1638 2561834725|251847|0999 0292970702|0999 0292970702|3237|0939|6999 "
    "0030|6090|9093|9699|9969|3909|0906|0300 300336|036385977939 609366|933315072969";

bool IsContinuation(char c) { return (static_cast<unsigned char>(c) & 0xC0) == 0x80; }

std::string_view GetGlyph(char c) {
    bool const isIcon = c > 0 && c <= kRedoIcon[0];
    int const index = isIcon ? '~' - ' ' + c : c >= ' ' && c <= '~' ? c - ' ' : '?' - ' ';
    std::string_view glyphs = kGlyphs;
    for (int i = 0; i < index; ++i) glyphs.remove_prefix(glyphs.find(' ') + 1);
    return glyphs.substr(0, glyphs.find(' '));
}

} // namespace

float MeasureLetters(std::string_view text, float unit) {
    auto const count =
        text.size() - static_cast<std::size_t>(std::count_if(text.begin(), text.end(), IsContinuation));
    return static_cast<float>(count) * kAdvance * unit;
}

void DrawLetters(IMKCanvas& canvas, std::string_view text, float x, float y, float unit, unsigned argb) {
    MKPaint paint;
    paint.SetColor(static_cast<int>(argb));
    paint.SetAntiAliasing(true);
    paint.SetLineWidth(std::max(1.0f, kThickness * unit));
    paint.SetLineCapType(MKPaint::Round);
    for (char const c : text) {
        if (IsContinuation(c)) continue;
        std::string_view const glyph = GetGlyph(c);
        PointF last;
        bool isFirst = true;
        for (std::size_t i = 0; i + 1 < glyph.size(); i += isFirst ? 1 : 2) {
            bool const isLine = !isFirst;
            isFirst = glyph[i] == '|';
            if (isFirst) continue;
            PointF const next(x + static_cast<float>(glyph[i] - '0') * unit,
                              y + static_cast<float>(glyph[i + 1] - '0') * unit);
            if (isLine) canvas.DrawLine(last, next, &paint);
            last = next;
        }
        x += kAdvance * unit;
    }
}

} // namespace Moka::Notebook
