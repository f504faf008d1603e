#include "moka/base/String.h"

#include <gtest/gtest.h>

#include <string>

namespace Moka {
namespace {

std::u16string Units(String const& s) { return {s.GetPointer(), static_cast<std::size_t>(s.GetLength())}; }

String FromUnits(std::u16string const& units) { return String(units.data(), static_cast<int>(units.size())); }

TEST(StringTest, EveryCodePointSurvivesTheRoundTrip) {
    std::string previous;
    for (char32_t codePoint = 1; codePoint <= 0x10ffff; ++codePoint) {
        if (codePoint >= 0xd800 && codePoint <= 0xdfff) continue;
        std::u16string units{static_cast<char16_t>(codePoint)};
        if (codePoint >= 0x10000) {
            units = {static_cast<char16_t>(0xd800 + (codePoint - 0x10000) / 0x400),
                     static_cast<char16_t>(0xdc00 + (codePoint - 0x10000) % 0x400)};
        }
        std::string const utf8 = FromUnits(units).ToUtf8();
        ASSERT_EQ(Units(String(utf8)), units) << std::hex << static_cast<unsigned>(codePoint);
        // UTF-8 sorts as the code points do, and each length is as long as its range.
        ASSERT_LT(previous, utf8) << std::hex << static_cast<unsigned>(codePoint);
        std::size_t const length = codePoint < 0x80 ? 1 : codePoint < 0x800 ? 2 : codePoint < 0x10000 ? 3 : 4;
        ASSERT_EQ(utf8.size(), length);
        previous = utf8;
    }
    EXPECT_EQ(FromUnits(u"aä€\U0001f600").ToUtf8(), "a\xc3\xa4\xe2\x82\xac\xf0\x9f\x98\x80");
}

TEST(StringTest, MalformedUtf8BecomesReplacementsAndTheRestIsKept) {
    struct {
        char const* what;
        char const* utf8;
        char16_t const* units;
    } const cases[] = {
        {"stray continuation", "a\x80z", u"a\ufffdz"},
        {"overlong, two bytes", "\xc1\xbf", u"\ufffd\ufffd"},
        {"overlong, three bytes", "\xe0\x9f\xbfz", u"\ufffd\ufffd\ufffdz"},
        {"overlong, four bytes", "\xf0\x8f\xbf\xbf", u"\ufffd\ufffd\ufffd\ufffd"},
        {"surrogates", "\xed\xa0\x80\xed\xbf\xbf", u"\ufffd\ufffd\ufffd\ufffd\ufffd\ufffd"},
        {"above the last code point", "\xf4\x90\x80\x80\xf5", u"\ufffd\ufffd\ufffd\ufffd\ufffd"},
        {"no such lead", "\xf8\x88\x80\x80\x80", u"\ufffd\ufffd\ufffd\ufffd\ufffd"},
        {"truncated at the end", "a\xe2\x82", u"a\ufffd"},
        {"truncated, then another", "\xf0\x9f\x98\xe2\x82\xac", u"\ufffd\u20ac"},
        {"truncated, then ASCII and a lead", "\xc3z\xe2\x82\xc3\xa4", u"\ufffdz\ufffd\u00e4"},
        {"the last before and after the surrogates", "\xed\x9f\xbf\xee\x80\x80", u"\ud7ff\ue000"},
    };
    for (auto const& c : cases) EXPECT_EQ(Units(String(c.utf8)), c.units) << c.what;
}

// Also those that are UTF-8 in parts, or what UTF-8 forbids: a surrogate, and a form that is too long.
TEST(StringTest, AnyBytesOfAFileNameSurviveTheRoundTrip) {
    for (std::string const bytes : {"plain.png", "\xE9t\xE9.png", "\xFF\xFE", "\xED\xB2\x80", "\xC0\xAF",
                                    "\xF0\x9F\x98", "\xF0\x9F\x98\x80\x80", "\xC3\xA9/\xE9"}) {
        String const name = String::FromFileName(bytes);
        EXPECT_EQ(name.ToFileName(), bytes);
        EXPECT_EQ(name.ToUtf8(), String(name.ToUtf8()).ToUtf8()) << "what is shown is UTF-8";
    }
    EXPECT_EQ(String::FromFileName("\xC3\xA9"), String("\xC3\xA9"));
    EXPECT_EQ(String(u"a\xD800z", 3).ToFileName(), "a\xEF\xBF\xBDz");
}

TEST(StringTest, BufferConversionCutsAtACharacterAndTerminates) {
    String const text = FromUnits(u"aä€\U0001f600b"); // characters end at bytes 1, 3, 6, 10, 11
    std::string const whole = text.ToUtf8();
    int room = 0;
    for (std::size_t const used : {0u, 1u, 1u, 3u, 3u, 3u, 6u, 6u, 6u, 6u, 10u, 11u, 11u, 11u}) {
        std::string buffer(20, '#');
        EXPECT_EQ(text.ToUtf8(buffer.data(), room), static_cast<int>(used)) << room;
        EXPECT_EQ(buffer, whole.substr(0, used) + '\0' + std::string(19 - used, '#')) << room;
        ++room;
    }
    char byte = '#';
    EXPECT_EQ(text.ToUtf8(nullptr, 5), -1);
    EXPECT_EQ(text.ToUtf8(&byte, -1), -1);
    EXPECT_EQ(byte, '#');
    EXPECT_EQ(String().ToUtf8(&byte, 0), 0);
    EXPECT_EQ(byte, '\0');
}

TEST(StringTest, SubStringStaysInsideAndLeavesTheResultOnRefusal) {
    String const text("picture.PNG");
    String result("before");
    for (int const start : {-1, 12}) {
        EXPECT_FALSE(text.SubString(start, &result));
        EXPECT_FALSE(text.SubString(start, 1, &result));
    }
    EXPECT_FALSE(text.SubString(0, -1, &result));
    EXPECT_FALSE(text.SubString(0, nullptr));
    EXPECT_EQ(result, String("before"));
    EXPECT_TRUE(text.SubString(11, &result));
    EXPECT_TRUE(result.IsEmpty());
    EXPECT_TRUE(text.SubString(8, 2000000000, &result));
    EXPECT_EQ(result, String("PNG"));
    EXPECT_TRUE(result.SubString(1, 1, &result)) << "into itself";
    EXPECT_EQ(result.Append(result).ToUtf8(), "NN");
    result.Clear();
    EXPECT_TRUE(result.IsEmpty());
}

TEST(StringTest, FindsTheLastOccurrence) {
    std::pair<char const*, int> const cases[] = {{".", 5}, {"ar", 3}, {"a.t", 0}, {"/", -1}, {"", 8}};
    for (auto const& [part, at] : cases) EXPECT_EQ(String("a.tar.gz").ReverseFind(part), at) << part;
}

} // namespace
} // namespace Moka
