// SceneError: a scene that cannot be read or drawn; one line for the person who wrote it.
#pragma once

#include <stdexcept>
#include <string>

namespace Moka::Scenes {

struct SceneValue;

class SceneError : public std::runtime_error {
public:
    explicit SceneError(std::string const& message) : std::runtime_error(message) {}
};

// Before the file is known: what of its text is wrong. The message begins with ": " where it does not go on
// with the name of the place, as " must be a number" does.
class SceneValueError : public SceneError {
public:
    SceneValueError(SceneValue const& value, std::string const& message)
        : SceneError(message), mValue(&value) {}

    SceneValue const& GetValue() const { return *mValue; }

private:
    SceneValue const* mValue; // in the tree that was read
};

// No tree could be read: what is wrong, and where.
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
