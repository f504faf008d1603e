// SceneError: a scene that cannot be read or drawn; one line for the person who wrote it.
#pragma once

#include <stdexcept>
#include <string>

namespace Moka::Scenes {

class SceneError : public std::runtime_error {
public:
    explicit SceneError(std::string const& message) : std::runtime_error(message) {}
};

// Before the file is known: what is wrong, and in which line.
class SceneLineError : public SceneError {
public:
    SceneLineError(int line, std::string const& message) : SceneError(message), mLine(line) {}

    int GetLine() const { return mLine; }

private:
    int mLine;
};

} // namespace Moka::Scenes
