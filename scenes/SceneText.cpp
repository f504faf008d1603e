#include "scenes/SceneText.h"

#include "scenes/SceneError.h"

#include <algorithm>
#include <cfloat>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <nlohmann/json.hpp>

namespace Moka::Scenes {
namespace {

struct Place {
    int line = 1;
    int column = 0;
};

// The JSON parser reports no positions. So this class follows its input: the position of the last character,
// and the beginning of the value or key that it belongs to. A text begins at its first quote, a number or a
// word at its first character.
class Position {
public:
    explicit Position(std::string_view text) : mAt(text.data()) {}

    char const* GetNext() const { return mAt; }
    Place const& GetLast() const { return mLast; }
    Place const& GetToken() const { return mToken; }

    void Advance() {
        char const c = *mAt++;
        // A line break counts as part of the line that it ends.
        if (mIsAfterBreak) mLast = {mLast.line + 1, 0};
        mIsAfterBreak = c == '\n';
        bool const isContinued = (static_cast<unsigned char>(c) & 0xC0) == 0x80; // within a UTF-8 character
        if (!isContinued) ++mLast.column;
        mIsInText ? FollowText(c) : FollowStructure(c);
    }

private:
    void FollowText(char c) {
        if (!mIsEscaped && c == '"') mIsInText = false;
        mIsEscaped = !mIsEscaped && c == '\\';
    }

    void FollowStructure(char c) {
        bool const isBetween = std::strchr(" \t\r\n,:]}", c) != nullptr;
        bool const isOpening = c == '{' || c == '[' || c == '"';
        if (isOpening || (!isBetween && !mIsInWord)) mToken = mLast;
        mIsInWord = !isBetween && !isOpening;
        mIsInText = c == '"';
    }

    char const* mAt;
    Place mLast;
    Place mToken;
    bool mIsAfterBreak = false;
    bool mIsInText = false;
    bool mIsEscaped = false;
    bool mIsInWord = false;
};

class CountingIterator {
public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = char const*;
    using reference = char const&;

    CountingIterator(Position* position, char const* end) : mPosition(position), mEnd(end) {}

    char const& operator*() const { return *mPosition->GetNext(); }
    CountingIterator& operator++() {
        mPosition->Advance();
        return *this;
    }
    // The parser compares iterators with the end only.
    friend bool operator==(CountingIterator const& a, CountingIterator const&) {
        return a.mPosition->GetNext() == a.mEnd;
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
    bool binary(binary_t&) override { return false; } // does not occur in JSON text

    bool start_object(std::size_t) override { return Open(SceneValue::Kind::Object); }
    bool start_array(std::size_t) override { return Open(SceneValue::Kind::List); }
    bool end_object() override { return mOpen.pop_back(), true; }
    bool end_array() override { return mOpen.pop_back(), true; }

    bool key(string_t& name) override {
        std::vector<std::string>& keys = mOpen.back()->keys;
        if (std::find(keys.begin(), keys.end(), name) != keys.end())
            Throw(mPosition.GetToken(), "\"" + name + "\" is given twice");
        keys.push_back(name);
        return true;
    }

    bool parse_error(std::size_t, std::string const&, nlohmann::json::exception const& error) override {
        // Drops the beginning, which is the parser's name of the error and its own position.
        std::string const text = error.what();
        std::size_t const syntax = text.find("syntax error");
        bool const isSyntax = syntax != std::string::npos;
        std::size_t const at = isSyntax ? syntax : std::min(text.size(), text.find("] ") + 2);
        // For a number that is too large, the parser has read beyond its end, so use its beginning.
        Throw(isSyntax ? mPosition.GetLast() : mPosition.GetToken(), "this is no JSON: " + text.substr(at));
    }

private:
    [[noreturn]] static void Throw(Place const& place, std::string const& message) {
        throw SceneTextError(place.line, std::max(place.column, 1), message);
    }

    SceneValue& Add(SceneValue::Kind kind) {
        if (++mCount > kMaxValues)
            Throw(mPosition.GetToken(), "more than " + std::to_string(kMaxValues) + " values");
        SceneValue* value = &mRoot;
        if (!mOpen.empty()) value = &mOpen.back()->items.emplace_back();
        value->kind = kind;
        value->line = mPosition.GetToken().line;
        value->column = mPosition.GetToken().column;
        return *value;
    }

    bool AddNumber(double number) {
        if (!(std::abs(number) <= double{FLT_MAX})) Throw(mPosition.GetToken(), "a number is too large");
        Add(SceneValue::Kind::Number).number = number;
        return true;
    }

    bool Open(SceneValue::Kind kind) {
        SceneValue& value = Add(kind);
        if (mOpen.size() == static_cast<std::size_t>(kMaxNesting))
            Throw(mPosition.GetToken(), "nested more than " + std::to_string(kMaxNesting) + " levels deep");
        // The address stays valid while the value is open, because items are added after it only when it is
        // closed.
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

std::string Step(SceneValue const& parent, std::size_t index) {
    if (parent.kind == SceneValue::Kind::List) return '[' + std::to_string(index) + ']';
    std::string const& key = parent.keys[index];
    bool const isPlain = !key.empty() && key.find_first_of(".[]\" ") == std::string::npos;
    return isPlain ? '.' + key : "[\"" + key + "\"]";
}

bool FindSteps(SceneValue const& from, SceneValue const& value, std::string& path) {
    if (&from == &value) return true;
    for (std::size_t i = 0; i < from.items.size(); ++i) {
        std::size_t const length = path.size();
        path += Step(from, i);
        if (FindSteps(from.items[i], value, path)) return true;
        path.resize(length);
    }
    return false;
}

} // namespace

std::string FindPath(SceneValue const& root, SceneValue const& value) {
    std::string path;
    if (!FindSteps(root, value, path) || path.empty()) return "the scene";
    return path.front() == '.' ? path.substr(1) : path;
}

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
    Position position(text);
    char const* const end = text.data() + text.size();
    TreeBuilder builder(position);
    nlohmann::json::sax_parse(CountingIterator(&position, end), CountingIterator(&position, end), &builder);
    return builder.Take();
}

} // namespace Moka::Scenes
