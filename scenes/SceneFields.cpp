#include "scenes/SceneFields.h"

#include "moka/graphics/paint/MKPaint.h"
#include "scenes/SceneError.h"

#include <algorithm>
#include <cmath>

namespace Moka::Scenes {
namespace {

using Kind = SceneValue::Kind;

std::string Join(std::vector<std::string> const& names) {
    std::string text;
    for (std::string const& name : names) text += (text.empty() ? "" : ", ") + name;
    return text;
}

bool IsWholeNumber(SceneValue const& value, int low, int high) {
    return value.kind == Kind::Number && value.number == std::floor(value.number) && value.number >= low &&
           value.number <= high;
}

bool IsHexColor(std::string const& text) {
    return (text.size() == 7 || text.size() == 9) && text[0] == '#' &&
           text.find_first_not_of("0123456789abcdefABCDEF", 1) == std::string::npos;
}

} // namespace

void ThrowExpected(SceneValue const& value, std::string const& expected) {
    throw SceneValueError(value, " must be " + expected + ", not " + value.Describe());
}

bool ReadBool(SceneValue const& value) {
    if (value.kind != Kind::Boolean) ThrowExpected(value, "true or false");
    return value.number != 0;
}

float ReadFloat(SceneValue const& value) {
    if (value.kind != Kind::Number) ThrowExpected(value, "a number");
    return static_cast<float>(value.number);
}

int ReadInt(SceneValue const& value, int low, int high) {
    if (IsWholeNumber(value, low, high)) return static_cast<int>(value.number);
    bool const isAny = low == INT_MIN && high == INT_MAX;
    ThrowExpected(value, isAny
                             ? "a whole number"
                             : "a whole number from " + std::to_string(low) + " to " + std::to_string(high));
}

std::string ReadText(SceneValue const& value) {
    if (value.kind != Kind::Text) ThrowExpected(value, "a text");
    return value.text;
}

std::vector<float> ReadFloats(SceneValue const& value, std::size_t count, char const* form) {
    if (value.kind != Kind::List || value.items.size() != count) ThrowExpected(value, form);
    std::vector<float> numbers;
    for (SceneValue const& item : value.items) {
        if (item.kind != Kind::Number) ThrowExpected(item, "a number");
        numbers.push_back(static_cast<float>(item.number));
    }
    return numbers;
}

PointF ReadPoint(SceneValue const& value) {
    std::vector<float> const n = ReadFloats(value, 2, "[x, y]");
    return {n[0], n[1]};
}

RectF ReadRect(SceneValue const& value) {
    std::vector<float> const n = ReadFloats(value, 4, "[left, top, right, bottom]");
    return {n[0], n[1], n[2], n[3]};
}

Matrix3f ReadMatrix(SceneValue const& value) {
    return Matrix3f(ReadFloats(value, 9, "nine numbers, column by column").data());
}

Vector4<float> ReadColor(SceneValue const& value) {
    constexpr char kForms[] = "\"#RRGGBB\", \"#AARRGGBB\", [r, g, b] or [r, g, b, a]";
    if (value.kind == Kind::Text && IsHexColor(value.text)) {
        unsigned const argb = static_cast<unsigned>(std::stoul(value.text.substr(1), nullptr, 16));
        MKPaint paint;
        paint.SetColor(static_cast<int>(value.text.size() == 7 ? argb | 0xFF000000u : argb));
        return paint.GetColor();
    }
    bool const hasAlpha = value.items.size() == 4;
    std::vector<float> const n = ReadFloats(value, hasAlpha ? 4 : 3, kForms);
    return {n[0], n[1], n[2], hasAlpha ? n[3] : 1};
}

int ReadEnum(SceneValue const& value, std::vector<std::string> const& names) {
    if (IsWholeNumber(value, INT_MIN, INT_MAX)) return static_cast<int>(value.number);
    auto const found = std::find(names.begin(), names.end(), value.text);
    if (value.kind != Kind::Text || found == names.end())
        ThrowExpected(value, "one of " + Join(names) + " or its number");
    return static_cast<int>(found - names.begin());
}

SceneFields::SceneFields(SceneValue const& object) : mObject(object) {
    if (object.kind != Kind::Object) ThrowExpected(object, "an object, { ... }");
}

SceneValue const* SceneFields::Find(char const* key) {
    if (std::find(mAsked.begin(), mAsked.end(), key) == mAsked.end()) mAsked.emplace_back(key);
    auto const found = std::find(mObject.keys.begin(), mObject.keys.end(), key);
    return found == mObject.keys.end()
               ? nullptr
               : &mObject.items[static_cast<std::size_t>(found - mObject.keys.begin())];
}

SceneValue const& SceneFields::Get(char const* key) {
    SceneValue const* const value = Find(key);
    if (!value) throw SceneValueError(mObject, std::string(" needs \"") + key + "\"");
    return *value;
}

void SceneFields::CheckAll() const {
    for (std::size_t i = 0; i < mObject.keys.size(); ++i) {
        std::string const& key = mObject.keys[i];
        if (std::find(mAsked.begin(), mAsked.end(), key) == mAsked.end())
            throw SceneValueError(mObject.items[i],
                                  " is unknown; there are " + (mAsked.empty() ? "no fields" : Join(mAsked)));
    }
}

} // namespace Moka::Scenes
