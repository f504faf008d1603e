#include "apps/notebook/Replay.h"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <fstream>
#include <sstream>
#include <type_traits>

namespace Moka::Notebook {
namespace {

constexpr char kIdle[] = "idle"; // waits until the window has nothing to do

// A number of an event: where it stands, and its type.
struct Field {
    std::size_t at;
    enum Type { None, Byte, Short, Int, Long, Float } type;
};

struct Word {
    char const* name;
    Uint32 type;
    Field fields[4];
};

#define AT(member) offsetof(SDL_Event, member)
constexpr Field kButton[] = {
    {AT(button.x), Field::Int}, {AT(button.y), Field::Int}, {AT(button.button), Field::Byte}};
constexpr Field kKey[] = {{AT(key.keysym.sym), Field::Int}, {AT(key.keysym.mod), Field::Short}};
constexpr Field kFinger[] = {{AT(tfinger.fingerId), Field::Long},
                             {AT(tfinger.x), Field::Float},
                             {AT(tfinger.y), Field::Float},
                             {AT(tfinger.pressure), Field::Float}};
constexpr Word kWords[] = {
    {"move",
     SDL_MOUSEMOTION,
     {{AT(motion.x), Field::Int}, {AT(motion.y), Field::Int}, {AT(motion.state), Field::Int}}},
    {"press", SDL_MOUSEBUTTONDOWN, {kButton[0], kButton[1], kButton[2]}},
    {"release", SDL_MOUSEBUTTONUP, {kButton[0], kButton[1], kButton[2]}},
    {"wheel", SDL_MOUSEWHEEL, {{AT(wheel.preciseX), Field::Float}, {AT(wheel.preciseY), Field::Float}}},
    {"key", SDL_KEYDOWN, {kKey[0], kKey[1]}},
    {"keyup", SDL_KEYUP, {kKey[0], kKey[1]}},
    {"text", SDL_TEXTINPUT, {}},
    {"finger-down", SDL_FINGERDOWN, {kFinger[0], kFinger[1], kFinger[2], kFinger[3]}},
    {"finger", SDL_FINGERMOTION, {kFinger[0], kFinger[1], kFinger[2], kFinger[3]}},
    {"finger-up", SDL_FINGERUP, {kFinger[0], kFinger[1], kFinger[2], kFinger[3]}},
    {"drop", SDL_DROPFILE, {}},
    {"quit", SDL_QUIT, {}},
};
#undef AT

// Null for a word that is none.
template <class Matches>
Word const* FindWord(Matches const& matches) {
    auto const* const found = std::find_if(std::begin(kWords), std::end(kWords), matches);
    return found == std::end(kWords) ? nullptr : found;
}

// Calls function with a reference to the field.
template <class Function>
void Visit(SDL_Event& event, Field const& field, Function const& function) {
    void* const at = reinterpret_cast<char*>(&event) + field.at;
    switch (field.type) {
    case Field::Byte:
        return function(*static_cast<Uint8*>(at));
    case Field::Short:
        return function(*static_cast<Uint16*>(at));
    case Field::Int:
        return function(*static_cast<Sint32*>(at));
    case Field::Long:
        return function(*static_cast<Sint64*>(at));
    case Field::Float:
        return function(*static_cast<float*>(at));
    case Field::None:
        return;
    }
}

// What stands behind the word.
std::string Describe(Word const& word, SDL_Event event) {
    if (event.type == SDL_TEXTINPUT) return event.text.text;
    if (event.type == SDL_DROPFILE) return event.drop.file ? event.drop.file : "";
    std::ostringstream out;
    for (Field const& field : word.fields) Visit(event, field, [&out](auto value) { out << +value << ' '; });
    return out.str();
}

// False if there are too few numbers.
bool Fill(Word const& word, SDL_Event& event, std::string const& rest) {
    event.type = word.type;
    if (word.type == SDL_TEXTINPUT)
        std::snprintf(event.text.text, sizeof(event.text.text), "%s", rest.c_str());
    std::istringstream in(rest);
    for (Field const& field : word.fields) {
        Visit(event, field, [&in](auto& value) {
            auto number = +value;
            in >> number;
            value = static_cast<std::remove_reference_t<decltype(value)>>(number);
        });
    }
    return !in.fail();
}

} // namespace

Recorder::Recorder(std::string const& path) : mFile(path.empty() ? nullptr : std::fopen(path.c_str(), "w")) {}

void Recorder::Add(SDL_Event const& event) {
    Word const* const word = FindWord([&](Word const& w) { return w.type == event.type; });
    if (!mFile || !word) return;
    std::fprintf(mFile.get(), "%u %s %s\n", event.common.timestamp - mStart, word->name,
                 Describe(*word, event).c_str());
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
        std::string name;
        in >> line.time >> name;
        bool isGood = !in.fail();
        if (in.get() == ' ') std::getline(in, line.rest);
        Word const* const word = FindWord([&](Word const& w) { return w.name == name; });
        line.isIdle = name == kIdle;
        isGood = isGood && (word ? Fill(*word, line.event, line.rest) : line.isIdle);
        if (!isGood) return reason = path + ':' + std::to_string(number) + ": no event: " + text, false;
        mLines.push_back(std::move(line));
    }
    return true;
}

int Replay::Pump(bool isIdle) {
    std::uint32_t const now = SDL_GetTicks();
    if (!mIsStarted) mStart = now;
    mIsStarted = true;
    for (; IsActive(); ++mNext) {
        Line const& line = mLines[mNext];
        if (line.isIdle) {
            if (!isIdle) return 10;
            mStart = now - line.time;
            isIdle = false; // what follows may be something to do
            continue;
        }
        auto const wait = static_cast<std::int32_t>(mStart + line.time - now);
        if (wait > 0) return wait;
        SDL_Event event = line.event;
        event.common.timestamp = mStart + line.time;
        if (event.type == SDL_DROPFILE) event.drop.file = SDL_strdup(line.rest.c_str());
        // Not SDL_PushEvent, which replaces the time.
        SDL_PeepEvents(&event, 1, SDL_ADDEVENT, event.type, event.type);
    }
    return -1;
}

} // namespace Moka::Notebook
