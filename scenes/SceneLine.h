// SceneLine: builds the text of one operation of a scene field by field. SceneSteps reads it. Floats are read
// back exactly.
#pragma once

#include "moka/base/Point.h"
#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix3.h"
#include "moka/graphics/math/Vector.h"

#include <array>
#include <string>
#include <utility>
#include <vector>

namespace Moka::Scenes {

// Returns a JSON string with its quotation marks. Invalid UTF-8 becomes U+FFFD.
std::string Quote(std::string const& text);

class SceneLine {
public:
    explicit SceneLine(std::string operation) : mOperation(std::move(operation)) {}

    SceneLine& Add(char const* key, float value);
    SceneLine& Add(char const* key, int value);
    SceneLine& Add(char const* key, bool value);
    SceneLine& Add(char const* key, PointF const& point);
    SceneLine& Add(char const* key, RectF const& rect);
    SceneLine& Add(char const* key, Matrix3f const& matrix);
    SceneLine& Add(char const* key, Vector4<float> const& color);
    SceneLine& Add(char const* key, std::vector<PointF> const& points);
    SceneLine& Add(char const* key, std::vector<RectF> const& rects);
    SceneLine& Add(char const* key, std::vector<std::array<float, 3>> const& items);
    SceneLine& AddText(char const* key, std::string const& text) { return AddRaw(key, Quote(text)); }
    // Adds a field whose value is JSON text.
    SceneLine& AddRaw(char const* key, std::string const& text);

    std::string const& GetOperation() const { return mOperation; }
    // The number of operations that the line counts as: the items of its list, or 1.
    long long GetCount() const { return mCount; }
    // False if a field has a number that JSON cannot represent.
    bool IsFinite() const { return mIsFinite; }

    // {"rect": [1, 2, 3, 4], ...}
    std::string GetFields() const { return '{' + mFields + '}'; }
    std::string GetText() const { return '{' + Quote(mOperation) + ": " + GetFields() + '}'; }

private:
    template <class Item, class GetNumbers>
    SceneLine& AddList(char const* key, std::vector<Item> const& items, GetNumbers const& getNumbers);
    void Begin(char const* key);
    void Write(float value);
    void Write(float const* values, std::size_t count);

    std::string mOperation;
    std::string mFields;
    long long mCount = 1;
    bool mIsFinite = true;
};

} // namespace Moka::Scenes
