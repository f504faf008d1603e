// Edits of a page: what they do, how they are taken back, and how much of them is kept.
#include "tests/unit/notebook/NotebookObjects.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

TEST(NotebookPageTest, UndoAndRedoWalkThroughEveryStateInOrder) {
    Page page;
    std::vector<Objects> states{page.GetObjects()};
    auto const keep = [&] { states.push_back(page.GetObjects()); };
    for (int i = 0; i < 3; ++i) {
        page.Append(MakeDash(0, static_cast<float>(100 * i)));
        keep();
    }
    page.Begin(); // one stroke becomes two, another one goes
    page.Replace(2, {});
    page.Replace(1, {MakeDash(0, 5), MakeDash(0, 6)});
    page.End();
    keep();
    for (std::size_t i = states.size() - 1; i-- > 0;) {
        ASSERT_TRUE(page.Undo());
        EXPECT_EQ(page.GetObjects(), states[i]);
    }
    EXPECT_FALSE(page.Undo());
    for (std::size_t i = 1; i < states.size(); ++i) {
        ASSERT_TRUE(page.Redo());
        EXPECT_EQ(page.GetObjects(), states[i]);
    }
    EXPECT_FALSE(page.Redo());
    page.Undo();
    page.Append(MakeDash(0, 900));
    EXPECT_FALSE(page.CanRedo()) << "a new edit ends what could be done again";
}

TEST(NotebookPageTest, FindsByBoundsFromTheLowestUpAndIsAsLongAsItIsWritten) {
    Page page;
    for (float const y : {100.0f, 200.0f, 110.0f}) page.Append(MakeDash(50, y));
    EXPECT_EQ(page.Find({60, 90, 70, 120}), (std::vector<std::size_t>{0, 2}));
    page.Replace(0, {});
    EXPECT_EQ(page.Find({60, 90, 70, 120}), (std::vector<std::size_t>{1}));
    page.Undo();
    EXPECT_EQ(page.Find({0, 0, 1200, 1000}), (std::vector<std::size_t>{0, 1, 2}));
    EXPECT_TRUE(page.Find({300, 90, 400, 120}).empty());
    EXPECT_EQ(page.GetHeight(), Page::kMinHeight);
    page.Append(MakeDash(0, 99'000));
    EXPECT_EQ(page.GetHeight(), 99'403);
    page.Undo();
    EXPECT_EQ(page.GetHeight(), Page::kMinHeight);
}

TEST(NotebookPageTest, ForgetsTheOldestEditsOverTheLimitAndNeverThePage) {
    Page page;
    InkPoints const points(100'000, {5, 5, 2}); // 1.2 MB each
    std::size_t const bytes = points.size() * sizeof(InkPoint);
    std::size_t const count = Page::kHistoryBytes / bytes + 20;
    for (std::size_t i = 0; i < count; ++i) page.Append(MakeStroke(points));
    EXPECT_LE(page.CountHistoryBytes(), Page::kHistoryBytes);
    EXPECT_EQ(page.GetObjects().size(), count);
    std::size_t steps = 0;
    while (page.Undo()) ++steps;
    EXPECT_EQ(page.GetObjects().size(), count - steps);
    EXPECT_GT(steps, Page::kHistoryBytes / bytes - 2);
    EXPECT_LT(steps, count);
}

TEST(NotebookPageTest, RefusesASpliceThatDoesNotFit) {
    Page page;
    page.Append(MakeDash(0, 0));
    EXPECT_FALSE(page.Apply({2, {}, {MakeDash(0, 1)}}));
    EXPECT_FALSE(page.Apply({0, {MakeDash(0, 0)}, {}})) << "another object than the one that is there";
    EXPECT_EQ(page.GetObjects().size(), 1u);
}

} // namespace
} // namespace Moka::Testing
