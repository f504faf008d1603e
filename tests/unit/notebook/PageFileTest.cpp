// Tests that pages are written and read back, and that problems are reported with their line.
#include "apps/notebook/PageFile.h"
#include "tests/unit/notebook/NotebookObjects.h"

#include <algorithm>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

using ::testing::HasSubstr;

std::string const kFolder = "/pages";

PageText Read(std::string const& text) { return ReadPage(text, "p.json", kFolder); }

Objects MakeObjects() {
    Objects objects{MakeStroke({{0.12f, 99'999.99f, 2.5f}, {-3, 0.07f, 0.01f}}, 0x60FFE000), MakeDash(5, 7)};
    for (char const* const file : {"/pages/in/a \"quoted\".png", "/other/b.jpg"})
        objects.push_back(std::make_shared<Object const>(Image{file, {1.5f, 2, 300.25f, 400}}));
    return objects;
}

// Also when a user or another program has changed the layout of the file.
TEST(NotebookFileTest, AWrittenPageIsReadBackBitByBitInAnyLayout) {
    Objects const objects = MakeObjects();
    std::string const text = WritePage(objects, 2000, kFolder);
    std::string line = text;
    std::replace(line.begin(), line.end(), '\n', ' ');
    for (std::string const& each : {text, line}) {
        PageText const page = Read(each);
        EXPECT_TRUE(page.problems.empty()) << page.problems.front();
        EXPECT_TRUE(AreSame(page.objects, objects));
    }
    EXPECT_TRUE(Read(WritePage({}, 1600, kFolder)).problems.empty());
}

TEST(NotebookFileTest, ReportsOmittedOperationsAndKeepsTheRest) {
    struct Case {
        char const* what;
        char const* from;
        char const* to;
        char const* problem;
        std::size_t left;
    };
    for (Case const& c :
         {Case{"an unknown operation", "\"DrawStroke\"", "\"DrawCircle\"", "p.json:3:", 3},
          Case{"a text instead of a number", "99999.99", "\"x\"", "p.json:3:", 3},
          Case{"no JSON", "-3.0,", "-3.0,,", "p.json:3:", 3}, Case{"cut off", "]}\n", "", "the file ends", 4},
          Case{"another width", "[1200,", "[1000,", "as wide as a page", 4},
          Case{"another paper", "#FFFFFF", "#FFFFF0", "on white paper", 4}}) {
        std::string text = WritePage(MakeObjects(), 2000, kFolder);
        std::size_t const at = c.to[0] ? text.find(c.from) : text.rfind(c.from);
        text.replace(at, std::string(c.from).size(), c.to);
        PageText const page = Read(text);
        ASSERT_FALSE(page.problems.empty()) << c.what;
        EXPECT_THAT(page.problems.front(), HasSubstr(c.problem)) << c.what;
        EXPECT_EQ(page.objects.size(), c.left) << c.what;
    }
    for (char const* const foreign : {"", "\x89PNG\r\n", "[]", "{\"operations\": [\n"})
        EXPECT_FALSE(Read(foreign).problems.empty()) << foreign;
}

} // namespace
} // namespace Moka::Testing
