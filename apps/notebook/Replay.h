// Replay: input as a text file, one event a line: milliseconds from the start, a word, numbers. A recorder writes
// what came; a replay hands it to SDL's queue again, at the times of the file and with them, so that what depends on
// speed comes out the same. docs/notebook.md lists the words.
// Thread: the window's.
#pragma once

#include <SDL.h>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Notebook {

class Recorder {
public:
    // Empty: nothing is recorded.
    explicit Recorder(std::string const& path);
    bool IsOpen() const { return mFile != nullptr; }
    void Add(SDL_Event const& event);

private:
    struct Close {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };
    std::unique_ptr<std::FILE, Close> mFile;
    std::uint32_t const mStart = SDL_GetTicks();
};

class Replay {
public:
    // False, with the line in the reason, if the file is none.
    bool Load(std::string const& path, std::string& reason);

    // Hands over what is due. isIdle: all that was asked for is drawn, loaded and written. Returns the milliseconds
    // until more is due, or -1.
    int Pump(bool isIdle);
    bool IsActive() const { return mNext < mLines.size(); }

private:
    struct Line {
        std::uint32_t time = 0;
        SDL_Event event{};
        bool isIdle = false;
        std::string rest; // behind the word
    };

    std::vector<Line> mLines;
    std::size_t mNext = 0;
    bool mIsStarted = false;
    std::uint32_t mStart = 0; // of the file's time, in SDL's
};

} // namespace Moka::Notebook
