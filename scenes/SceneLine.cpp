#include "scenes/SceneLine.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <nlohmann/json.hpp>

namespace Moka::Scenes {

std::string Quote(std::string const& text) {
    return nlohmann::json(text).dump(-1, ' ', true, nlohmann::json::error_handler_t::replace);
}

void SceneLine::Begin(char const* key) {
    if (!mFields.empty()) mFields += ", ";
    mFields += Quote(key) + ": ";
}

// Writes the shortest text that is read back as the same float. Because it is read in double precision first,
// some numbers need nine digits, which are always enough.
void SceneLine::Write(float value) {
    if (!std::isfinite(value)) {
        mIsFinite = false;
        return;
    }
    char text[32];
    auto end = std::to_chars(text, text + sizeof(text), value).ptr;
    double read = 0;
    std::from_chars(text, end, read);
    if (static_cast<float>(read) != value)
        end = std::to_chars(text, text + sizeof(text), value, std::chars_format::general, 9).ptr;
    mFields.append(text, end);
    // Without a point it would be read as a whole number, which has no negative zero.
    if (value == 0 && std::signbit(value)) mFields += ".0";
}

void SceneLine::Write(float const* values, std::size_t count) {
    mFields += '[';
    for (std::size_t i = 0; i < count; ++i) {
        if (i > 0) mFields += ", ";
        Write(values[i]);
    }
    mFields += ']';
}

SceneLine& SceneLine::Add(char const* key, float value) {
    Begin(key);
    Write(value);
    return *this;
}

SceneLine& SceneLine::Add(char const* key, int value) { return AddRaw(key, std::to_string(value)); }

SceneLine& SceneLine::Add(char const* key, bool value) { return AddRaw(key, value ? "true" : "false"); }

SceneLine& SceneLine::Add(char const* key, PointF const& point) {
    Begin(key);
    float const numbers[] = {point.x, point.y};
    Write(numbers, 2);
    return *this;
}

SceneLine& SceneLine::Add(char const* key, RectF const& rect) {
    Begin(key);
    float const numbers[] = {rect.left, rect.top, rect.right, rect.bottom};
    Write(numbers, 4);
    return *this;
}

SceneLine& SceneLine::Add(char const* key, Matrix3f const& matrix) {
    Begin(key);
    float numbers[9];
    for (int i = 0; i < 9; ++i) numbers[i] = matrix[i];
    Write(numbers, 9);
    return *this;
}

SceneLine& SceneLine::Add(char const* key, Vector4<float> const& color) {
    Begin(key);
    float const numbers[] = {color.x, color.y, color.z, color.w};
    Write(numbers, 4);
    return *this;
}

template <class Item, class GetNumbers>
SceneLine& SceneLine::AddList(char const* key, std::vector<Item> const& items, GetNumbers const& getNumbers) {
    Begin(key);
    mFields += '[';
    for (Item const& item : items) {
        if (&item != items.data()) mFields += ", ";
        auto const numbers = getNumbers(item);
        Write(numbers.data(), numbers.size());
    }
    mFields += ']';
    mCount = std::max(mCount, static_cast<long long>(items.size()));
    return *this;
}

SceneLine& SceneLine::Add(char const* key, std::vector<PointF> const& points) {
    return AddList(key, points, [](PointF const& p) { return std::array<float, 2>{p.x, p.y}; });
}

SceneLine& SceneLine::Add(char const* key, std::vector<RectF> const& rects) {
    return AddList(key, rects, [](RectF const& r) {
        return std::array<float, 4>{r.left, r.top, r.right, r.bottom};
    });
}

SceneLine& SceneLine::Add(char const* key, std::vector<std::array<float, 3>> const& items) {
    return AddList(key, items, [](std::array<float, 3> const& item) { return item; });
}

SceneLine& SceneLine::AddRaw(char const* key, std::string const& text) {
    Begin(key);
    mFields += text;
    return *this;
}

} // namespace Moka::Scenes
