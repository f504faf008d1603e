#include "apps/notebook/Replay.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <sstream>

namespace Moka::Notebook {
namespace {

constexpr char kIdle[] = "idle"; // waits until the window has nothing to do
constexpr SDL_TouchID kTouch = 1;

// Null for a word that is none.
struct Word {
    char const* name;
    Uint32 type;
};
constexpr Word kWords[] = {
    {"move", SDL_MOUSEMOTION},      {"press", SDL_MOUSEBUTTONDOWN},
    {"release", SDL_MOUSEBUTTONUP}, {"wheel", SDL_MOUSEWHEEL},
    {"key", SDL_KEYDOWN},           {"keyup", SDL_KEYUP},
    {"text", SDL_TEXTINPUT},        {"finger-down", SDL_FINGERDOWN},
    {"finger", SDL_FINGERMOTION},   {"finger-up", SDL_FINGERUP},
    {"drop", SDL_DROPFILE},         {"quit", SDL_QUIT},
};

Word const* FindWord(std::string const& name) {
    for (Word const& word : kWords)
        if (name == word.name) return &word;
    return nullptr;
}

Word const* FindWord(Uint32 type) {
    for (Word const& word : kWords)
        if (type == word.type) return &word;
    return nullptr;
}

// What stands behind the word.
std::string Describe(SDL_Event const& event) {
    char text[256] = "";
    auto const print = [&text](char const* format, auto... values) {
        std::snprintf(text, sizeof(text), format, values...);
    };
    switch (event.type) {
    case SDL_MOUSEMOTION:
        print("%d %d %u", event.motion.x, event.motion.y, event.motion.state);
        break;
    case SDL_MOUSEBUTTONDOWN:
    case SDL_MOUSEBUTTONUP:
        print("%d %d %d", event.button.x, event.button.y, event.button.button);
        break;
    case SDL_MOUSEWHEEL:
        print("%g %g", static_cast<double>(event.wheel.preciseX), static_cast<double>(event.wheel.preciseY));
        break;
    case SDL_KEYDOWN:
    case SDL_KEYUP:
        print("%d %d", event.key.keysym.sym, event.key.keysym.mod);
        break;
    case SDL_TEXTINPUT:
        return event.text.text;
    case SDL_FINGERDOWN:
    case SDL_FINGERMOTION:
    case SDL_FINGERUP:
        print("%d %.6g %.6g %.4g", static_cast<int>(event.tfinger.fingerId),
              static_cast<double>(event.tfinger.x), static_cast<double>(event.tfinger.y),
              static_cast<double>(event.tfinger.pressure));
        break;
    case SDL_DROPFILE:
        return event.drop.file ? event.drop.file : "";
    default:
        break;
    }
    return text;
}

// False if there are too few numbers.
bool Fill(SDL_Event& event, std::string const& rest) {
    std::istringstream in(rest);
    int button = 0;
    int id = 0;
    int modifiers = 0;
    switch (event.type) {
    case SDL_MOUSEMOTION:
        return !!(in >> event.motion.x >> event.motion.y >> event.motion.state);
    case SDL_MOUSEBUTTONDOWN:
    case SDL_MOUSEBUTTONUP:
        in >> event.button.x >> event.button.y >> button;
        event.button.button = static_cast<Uint8>(button);
        return !in.fail();
    case SDL_MOUSEWHEEL:
        return !!(in >> event.wheel.preciseX >> event.wheel.preciseY);
    case SDL_KEYDOWN:
    case SDL_KEYUP:
        in >> event.key.keysym.sym >> modifiers;
        event.key.keysym.mod = static_cast<Uint16>(modifiers);
        return !in.fail();
    case SDL_TEXTINPUT:
        std::snprintf(event.text.text, sizeof(event.text.text), "%s", rest.c_str());
        return true;
    case SDL_FINGERDOWN:
    case SDL_FINGERMOTION:
    case SDL_FINGERUP:
        in >> id >> event.tfinger.x >> event.tfinger.y >> event.tfinger.pressure;
        event.tfinger.touchId = kTouch;
        event.tfinger.fingerId = id;
        return !in.fail();
    default:
        return true;
    }
}

} // namespace

Recorder::Recorder(std::string const& path) : mFile(path.empty() ? nullptr : std::fopen(path.c_str(), "w")) {}

void Recorder::Add(SDL_Event const& event) {
    Word const* const word = FindWord(event.type);
    if (!mFile || !word) return;
    std::fprintf(mFile.get(), "%u %s %s\n", event.common.timestamp - mStart, word->name,
                 Describe(event).c_str());
    std::fflush(mFile.get()); // a session that crashes is the one to replay
}

bool Replay::Load(std::string const& path, std::string& reason) {
    std::ifstream file(path);
    if (!file) return reason = "cannot read " + path + ": " + std::strerror(errno), false;
    std::string text;
    for (int number = 1; std::getline(file, text); ++number) {
        if (text.empty() || text[0] == '#') continue;
        std::istringstream in(text);
        Line line;
        in >> line.time >> line.word;
        bool isGood = !in.fail();
        if (in.get() == ' ') std::getline(in, line.rest);
        SDL_Event event{};
        Word const* const word = FindWord(line.word);
        if (word) event.type = word->type;
        isGood = isGood && (word ? Fill(event, line.rest) : line.word == kIdle);
        if (!isGood) return reason = path + ':' + std::to_string(number) + ": no event: " + text, false;
        mLines.push_back(std::move(line));
    }
    return true;
}

bool Replay::MakeEvent(Line const& line, SDL_Window* window, SDL_Event& event) {
    Word const* const word = FindWord(line.word);
    if (!word) return false;
    event.type = word->type;
    Fill(event, line.rest);
    Uint32 const id = SDL_GetWindowID(window);
    switch (event.type) {
    case SDL_DROPFILE:
        event.drop.file = SDL_strdup(line.rest.c_str());
        event.drop.windowID = id;
        break;
    case SDL_QUIT:
        break;
    case SDL_FINGERDOWN:
    case SDL_FINGERMOTION:
    case SDL_FINGERUP:
        event.tfinger.windowID = id;
        break;
    default:
        event.window.windowID = id; // at the same place in all the others
    }
    return true;
}

int Replay::Pump(SDL_Window* window, bool isIdle) {
    std::uint32_t const now = SDL_GetTicks();
    if (!mIsStarted) mStart = now;
    mIsStarted = true;
    for (; IsActive(); ++mNext) {
        Line const& line = mLines[mNext];
        if (line.word == kIdle) {
            if (!isIdle) return 10;
            mStart = now - line.time;
            isIdle = false; // what follows may be something to do
            continue;
        }
        auto const wait = static_cast<std::int32_t>(mStart + line.time - now);
        if (wait > 0) return wait;
        SDL_Event event{};
        if (!MakeEvent(line, window, event)) continue;
        event.common.timestamp = mStart + line.time;
        // Not SDL_PushEvent, which replaces the time.
        SDL_PeepEvents(&event, 1, SDL_ADDEVENT, event.type, event.type);
    }
    return -1;
}

} // namespace Moka::Notebook
