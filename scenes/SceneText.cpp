#include "scenes/SceneText.h"

#include "scenes/SceneError.h"

#include <algorithm>
#include <cfloat>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <iterator>
#include <nlohmann/json.hpp>

namespace Moka::Scenes {
namespace {

// The parser tells no lines, so what it has read is counted here.
struct Position {
    char const* at;
    char const* begin;
    int line = 1; // of the character last read

    void Advance() {
        if (at != begin && at[-1] == '\n') ++line;
        ++at;
    }
};

class CountingIterator {
public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = char const*;
    using reference = char const&;

    CountingIterator(Position* position, char const* end) : mPosition(position), mEnd(end) {}

    char const& operator*() const { return *mPosition->at; }
    CountingIterator& operator++() {
        mPosition->Advance();
        return *this;
    }
    // Only ever compared with the end.
    friend bool operator==(CountingIterator const& a, CountingIterator const&) {
        return a.mPosition->at == a.mEnd;
    }
    friend bool operator!=(CountingIterator const& a, CountingIterator const& b) { return !(a == b); }

private:
    Position* mPosition;
    char const* mEnd;
};

class TreeBuilder : public nlohmann::json_sax<nlohmann::json> {
public:
    explicit TreeBuilder(Position const& position) : mPosition(position) {}

    SceneValue Take() { return std::move(mRoot); }

    bool null() override { return Add(SceneValue::Kind::Null), true; }
    bool boolean(bool value) override {
        Add(SceneValue::Kind::Boolean).number = value ? 1 : 0;
        return true;
    }
    bool number_integer(number_integer_t value) override { return AddNumber(static_cast<double>(value)); }
    bool number_unsigned(number_unsigned_t value) override { return AddNumber(static_cast<double>(value)); }
    bool number_float(number_float_t value, string_t const&) override { return AddNumber(value); }
    bool string(string_t& value) override {
        Add(SceneValue::Kind::Text).text = std::move(value);
        return true;
    }
    bool binary(binary_t&) override { return false; } // not in text

    bool start_object(std::size_t) override { return Open(SceneValue::Kind::Object); }
    bool start_array(std::size_t) override { return Open(SceneValue::Kind::List); }
    bool end_object() override { return mOpen.pop_back(), true; }
    bool end_array() override { return mOpen.pop_back(), true; }

    bool key(string_t& name) override {
        std::vector<std::string>& keys = mOpen.back()->keys;
        if (std::find(keys.begin(), keys.end(), name) != keys.end())
            throw SceneLineError(mPosition.line, "\"" + name + "\" is given twice");
        keys.push_back(name);
        return true;
    }

    bool parse_error(std::size_t, std::string const&, nlohmann::json::exception const& error) override {
        // What comes before is the parser's name of the error and its own count of lines.
        std::string const text = error.what();
        std::size_t at = text.find("syntax error");
        if (at == std::string::npos) at = std::min(text.size(), text.find("] ") + 2);
        throw SceneLineError(mPosition.line, "this is no JSON: " + text.substr(at));
    }

private:
    // The parser reads one character past a number. It is a line break at most, which does not count until
    // the next one is read.
    SceneValue& Add(SceneValue::Kind kind) {
        if (++mCount > kMaxValues)
            throw SceneLineError(mPosition.line, "more than " + std::to_string(kMaxValues) + " values");
        SceneValue* value = &mRoot;
        if (!mOpen.empty()) value = &mOpen.back()->items.emplace_back();
        value->kind = kind;
        value->line = mPosition.line;
        return *value;
    }

    bool AddNumber(double number) {
        if (!(std::abs(number) <= double{FLT_MAX}))
            throw SceneLineError(mPosition.line, "a number is too large");
        Add(SceneValue::Kind::Number).number = number;
        return true;
    }

    bool Open(SceneValue::Kind kind) {
        SceneValue& value = Add(kind);
        if (mOpen.size() == static_cast<std::size_t>(kMaxNesting))
            throw SceneLineError(mPosition.line,
                                 "nested more than " + std::to_string(kMaxNesting) + " levels deep");
        // Stays where it is while it is open: its neighbours come after it is closed.
        mOpen.push_back(&value);
        return true;
    }

    Position const& mPosition;
    SceneValue mRoot;
    std::vector<SceneValue*> mOpen;
    std::size_t mCount = 0;
};

constexpr std::size_t kShort = 40;

std::string DescribeNumber(double number) {
    char text[32];
    std::snprintf(text, sizeof(text), "%.9g", number);
    return text;
}

} // namespace

std::string SceneValue::Describe() const {
    switch (kind) {
    case Kind::Null:
        return "null";
    case Kind::Boolean:
        return number != 0 ? "true" : "false";
    case Kind::Number:
        return DescribeNumber(number);
    case Kind::Text:
        return '"' + (text.size() > kShort ? text.substr(0, kShort) + "..." : text) + '"';
    case Kind::List:
        return "a list of " + std::to_string(items.size());
    case Kind::Object:
        return "an object";
    }
    return {};
}

SceneValue ParseSceneText(std::string_view text) {
    Position position{text.data(), text.data()};
    char const* const end = text.data() + text.size();
    TreeBuilder builder(position);
    nlohmann::json::sax_parse(CountingIterator(&position, end), CountingIterator(&position, end), &builder);
    return builder.Take();
}

} // namespace Moka::Scenes
