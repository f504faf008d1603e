// SceneLine: the text of one operation of a scene, as SceneSteps reads it, built field by field. Floats are written
// so that they are read as the same ones.
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

// With its quotation marks. What is not UTF-8 becomes a mark of its own.
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
    // text is JSON.
    SceneLine& AddRaw(char const* key, std::string const& text);

    std::string const& GetOperation() const { return mOperation; }
    // Of a list of numbers, as many as the scene counts operations for; 1 without a list.
    long long GetCount() const { return mCount; }
    // False: a field has a number that JSON cannot say.
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
