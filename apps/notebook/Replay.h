// Replay: records input in a text file and replays it. Each line is an event: milliseconds from the start, a word,
// numbers. Replay pushes the events into SDL's queue at the recorded times and with these timestamps, so that strokes
// whose width depends on speed are reproduced. docs/notebook.md lists the words.
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
    // An empty path records nothing.
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
    // Returns false and sets reason, with the line, if the file is not a recording.
    bool Load(std::string const& path, std::string& reason);

    // Pushes the events that are due. isIdle: everything requested has been drawn, loaded and written. Returns the
    // milliseconds until the next event is due, or -1.
    int Pump(bool isIdle);
    bool IsActive() const { return mNext < mLines.size(); }

private:
    struct Line {
        std::uint32_t time = 0;
        SDL_Event event{};
        bool isIdle = false;
        std::string rest; // the text after the word
    };

    std::vector<Line> mLines;
    std::size_t mNext = 0;
    bool mIsStarted = false;
    std::uint32_t mStart = 0; // SDL's time at time 0 of the file
};

} // namespace Moka::Notebook
