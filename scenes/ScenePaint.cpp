#include "scenes/ScenePaint.h"

namespace Moka::Scenes {
namespace {

using Kind = SceneValue::Kind;

// The names of each enumeration, in the order of its numbers.
std::vector<std::string> const kXFermodes{"Add",
                                          "Clear",
                                          "Dst",
                                          "DstAtop",
                                          "DstIn",
                                          "DstOut",
                                          "DstOver",
                                          "Modulate",
                                          "Src",
                                          "SrcAtop",
                                          "SrcIn",
                                          "SrcOut",
                                          "SrcOver",
                                          "SrcKeepDstAlpha",
                                          "SrcNonPremultiplied",
                                          "SrcOverNonPremultiplied",
                                          "Darken",
                                          "Lighten",
                                          "BlendingOff"};
std::vector<std::string> const kStyles{"Fill", "FillAndStroke", "Stroke"};
std::vector<std::string> const kCaps{"Butt", "Round", "Square"};
std::vector<std::string> const kTileModes{"Default", "Clamp", "Mirror", "Repeat"};

MKPaint const& FindPaint(SceneValue const& value, NamedPaints const& named) {
    auto const found = named.find(ReadText(value));
    if (found != named.end()) return found->second;
    std::string names;
    for (auto const& [name, paint] : named) names += (names.empty() ? "" : ", ") + name;
    ThrowExpected(value, names.empty() ? "described under \"paints\"" : "one of " + names);
}

template <class Enum>
Enum ReadNumbered(SceneValue const& value, std::vector<std::string> const& names) {
    return static_cast<Enum>(ReadEnum(value, names));
}

void ReadColors(SceneFields& fields, MKPaint& paint) {
    if (SceneValue const* const value = fields.Find("color")) {
        Vector4<float> const c = ReadColor(*value);
        paint.SetColor(c.x, c.y, c.z, c.w);
    }
    if (SceneValue const* const value = fields.Find("alpha")) paint.SetAlpha(ReadFloat(*value));
    if (SceneValue const* const value = fields.Find("tintColor")) {
        Vector4<float> const c = ReadColor(*value);
        paint.SetTintColor(c.x, c.y, c.z, c.w);
    }
    if (SceneValue const* const value = fields.Find("xfermode"))
        paint.SetXFermode(ReadNumbered<MKPaint::XFermode>(*value, kXFermodes));
}

void ReadDashes(SceneFields& fields, MKPaint& paint) {
    SceneValue const* const value = fields.Find("dashedLinePattern");
    if (!value) return;
    bool const isShort = value->items.size() == 2;
    std::vector<float> const n = ReadFloats(*value, isShort ? 2 : 4, "[dash, gap] or [dash, gap, dash, gap]");
    if (isShort)
        paint.SetDashedLinePattern(Vector2<float>{n[0], n[1]});
    else
        paint.SetDashedLinePattern(Vector4<float>{n[0], n[1], n[2], n[3]});
}

void ReadStroke(SceneFields& fields, MKPaint& paint) {
    if (SceneValue const* const value = fields.Find("style"))
        paint.SetStyle(ReadNumbered<MKPaint::Style>(*value, kStyles));
    if (SceneValue const* const value = fields.Find("lineWidth")) paint.SetLineWidth(ReadFloat(*value));
    if (SceneValue const* const value = fields.Find("antiAliasing")) paint.SetAntiAliasing(ReadBool(*value));
    if (SceneValue const* const value = fields.Find("lineCapType"))
        paint.SetLineCapType(ReadNumbered<MKPaint::LineCapType>(*value, kCaps));
    ReadDashes(fields, paint);
}

void ReadTileMode(SceneFields& fields, MKPaint& paint) {
    SceneValue const* const value = fields.Find("tileMode");
    if (!value) return;
    auto const read = [&](SceneValue const& mode) {
        return ReadNumbered<MKPaint::TileMode>(mode, kTileModes);
    };
    if (value->kind == Kind::List && value->items.size() == 2)
        paint.SetTileMode(read(value->items[0]), read(value->items[1]));
    else
        paint.SetTileMode(read(*value));
}

std::string ToText(int number, std::vector<std::string> const& names) {
    bool const hasName = number >= 0 && static_cast<std::size_t>(number) < names.size();
    return hasName ? Quote(names[static_cast<std::size_t>(number)]) : std::to_string(number);
}

void AddNumbered(SceneLine& line, char const* key, int number, int plain,
                 std::vector<std::string> const& names) {
    if (number != plain) line.AddRaw(key, ToText(number, names));
}

} // namespace

MKPaint ReadPaint(SceneValue const& value, NamedPaints const& named) {
    if (value.kind == Kind::Text) return FindPaint(value, named);
    if (value.kind != Kind::Object) ThrowExpected(value, "a paint, { ... }, or the name of one");
    SceneFields fields(value);
    MKPaint paint;
    if (SceneValue const* const base = fields.Find("base")) paint = FindPaint(*base, named);
    ReadColors(fields, paint);
    ReadStroke(fields, paint);
    ReadTileMode(fields, paint);
    fields.CheckAll();
    return paint;
}

SceneLine DescribePaint(MKPaint const& paint) {
    SceneLine line("paint");
    MKPaint const plain;
    auto const same = [](Vector4<float> const& a, Vector4<float> const& b) {
        return a.x == b.x && a.y == b.y && a.z == b.z && a.w == b.w;
    };
    if (!same(paint.GetColor(), plain.GetColor())) line.Add("color", paint.GetColor());
    if (paint.HasTintColor()) line.Add("tintColor", paint.GetTintColor());
    AddNumbered(line, "xfermode", paint.GetXFermode(), plain.GetXFermode(), kXFermodes);
    AddNumbered(line, "style", paint.GetStyle(), plain.GetStyle(), kStyles);
    if (paint.GetLineWidth() != plain.GetLineWidth()) line.Add("lineWidth", paint.GetLineWidth());
    if (paint.IsAntiAliasing()) line.Add("antiAliasing", true);
    if (!same(paint.GetDashedLinePattern(), plain.GetDashedLinePattern()))
        line.Add("dashedLinePattern", paint.GetDashedLinePattern());
    AddNumbered(line, "lineCapType", paint.GetLineCapType(), plain.GetLineCapType(), kCaps);
    if (paint.GetTileModeX() != plain.GetTileModeX() || paint.GetTileModeY() != plain.GetTileModeY())
        line.AddRaw("tileMode", '[' + ToText(paint.GetTileModeX(), kTileModes) + ", " +
                                    ToText(paint.GetTileModeY(), kTileModes) + ']');
    return line;
}

} // namespace Moka::Scenes
