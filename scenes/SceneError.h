// SceneError: thrown if a scene cannot be read or drawn. The message is one line for the author of the scene.
#pragma once

#include <stdexcept>
#include <string>

namespace Moka::Scenes {

struct SceneValue;

class SceneError : public std::runtime_error {
public:
    explicit SceneError(std::string const& message) : std::runtime_error(message) {}
};

// An error in a value. The path of the value and the file's name are added in front of the message, so it
// begins with ": ", or with " must be", for example.
class SceneValueError : public SceneError {
public:
    SceneValueError(SceneValue const& value, std::string const& message)
        : SceneError(message), mValue(&value) {}

    SceneValue const& GetValue() const { return *mValue; }

private:
    SceneValue const* mValue; // in the tree that was read
};

// An error in the JSON text, with its position.
class SceneTextError : public SceneError {
public:
    SceneTextError(int line, int column, std::string const& message)
        : SceneError(message), mLine(line), mColumn(column) {}

    int GetLine() const { return mLine; }
    int GetColumn() const { return mColumn; }

private:
    int mLine;
    int mColumn;
};

} // namespace Moka::Scenes
