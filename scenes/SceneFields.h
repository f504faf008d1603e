// SceneFields.h: reads the values of a scene.
// Fails: throws SceneValueError, whose message contains the expected value and the actual one.
#pragma once

#include "moka/base/Point.h"
#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix3.h"
#include "moka/graphics/math/Vector.h"
#include "scenes/SceneText.h"

#include <climits>
#include <string>
#include <vector>

namespace Moka::Scenes {

bool ReadBool(SceneValue const& value);
float ReadFloat(SceneValue const& value);
int ReadInt(SceneValue const& value, int low = INT_MIN, int high = INT_MAX);
std::string ReadText(SceneValue const& value);
// form describes the numbers: "[x, y]".
std::vector<float> ReadFloats(SceneValue const& value, std::size_t count, char const* form);
PointF ReadPoint(SceneValue const& value);
RectF ReadRect(SceneValue const& value);
Matrix3f ReadMatrix(SceneValue const& value);
// "#RRGGBB", "#AARRGGBB", or a list of 3 or 4 components.
Vector4<float> ReadColor(SceneValue const& value);
// Reads a name as its position in names, or any whole number.
int ReadEnum(SceneValue const& value, std::vector<std::string> const& names);

// Throws the error of the functions above: " must be <expected>, not ...".
[[noreturn]] void ThrowExpected(SceneValue const& value, std::string const& expected);

// The fields of an object. CheckAll() throws if the object has a field that was not requested.
class SceneFields {
public:
    explicit SceneFields(SceneValue const& object);

    // Returns the field, or null. Get throws instead.
    SceneValue const* Find(char const* key);
    SceneValue const& Get(char const* key);

    float GetFloat(char const* key) { return ReadFloat(Get(key)); }
    int GetInt(char const* key) { return ReadInt(Get(key)); }
    PointF GetPoint(char const* key) { return ReadPoint(Get(key)); }
    RectF GetRect(char const* key) { return ReadRect(Get(key)); }

    void CheckAll() const;

private:
    SceneValue const& mObject;
    std::vector<std::string> mAsked;
};

} // namespace Moka::Scenes
