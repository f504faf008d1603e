// SceneFields.h: reads values of a scene, with messages for whoever wrote it.
// Fails: throws SceneLineError with the value's line: what was expected, and what is there.
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

// what names the value in a message: "DrawCircle: radius".
bool ReadBool(SceneValue const& value, std::string const& what);
float ReadFloat(SceneValue const& value, std::string const& what);
int ReadInt(SceneValue const& value, std::string const& what, int low = INT_MIN, int high = INT_MAX);
std::string ReadText(SceneValue const& value, std::string const& what);
// form tells what the numbers are: "[x, y]".
std::vector<float> ReadFloats(SceneValue const& value, std::string const& what, std::size_t count,
                              char const* form);
PointF ReadPoint(SceneValue const& value, std::string const& what);
RectF ReadRect(SceneValue const& value, std::string const& what);
Matrix3f ReadMatrix(SceneValue const& value, std::string const& what);
// "#RRGGBB", "#AARRGGBB", or a list of 3 or 4 components.
Vector4<float> ReadColor(SceneValue const& value, std::string const& what);
// A name stands for its position; any whole number is taken as it is.
int ReadEnum(SceneValue const& value, std::string const& what, std::vector<std::string> const& names);

// What the calls above throw: "what is expected, not ...".
[[noreturn]] void ThrowExpected(SceneValue const& value, std::string const& what,
                                std::string const& expected);

// The fields of an object. One that nobody asked for is an error, found by CheckAll().
class SceneFields {
public:
    SceneFields(SceneValue const& object, std::string what);

    // Null when it is not given.
    SceneValue const* Find(char const* key);
    SceneValue const& Get(char const* key);
    // For a message about a field: "DrawCircle: radius".
    std::string Name(char const* key) const { return mWhat + ": " + key; }
    std::string const& GetWhat() const { return mWhat; }
    int GetLine() const { return mObject.line; }

    float GetFloat(char const* key) { return ReadFloat(Get(key), Name(key)); }
    int GetInt(char const* key) { return ReadInt(Get(key), Name(key)); }
    PointF GetPoint(char const* key) { return ReadPoint(Get(key), Name(key)); }
    RectF GetRect(char const* key) { return ReadRect(Get(key), Name(key)); }

    void CheckAll() const;

private:
    SceneValue const& mObject;
    std::string const mWhat;
    std::vector<std::string> mAsked;
};

} // namespace Moka::Scenes
