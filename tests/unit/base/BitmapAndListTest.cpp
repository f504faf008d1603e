#include "moka/base/List.h"

#include "tests/support/Allocation.h"

#include <gtest/gtest.h>

#include "moka/base/Bitmap.h"
#include <algorithm>
#include <limits>
#include <numeric>
#include <random>
#include <vector>

namespace Moka {
namespace {

// Removals prefer the front, as a queue's do, so that the storage is compacted at many fill levels.
void Mutate(List<int>& list, std::vector<int*>& model, int* item, int choice) {
    auto const at = std::find(model.begin(), model.end(), item);
    if (choice < 50) {
        ASSERT_TRUE(list.Add(item));
        model.push_back(item);
    } else if (choice < 90) {
        int const index = choice < 80 || model.empty() ? 0 : choice * 7919 % static_cast<int>(model.size());
        EXPECT_EQ(list.RemoveAt(index), model.empty() ? nullptr : model[static_cast<std::size_t>(index)]);
        if (!model.empty()) model.erase(model.begin() + index);
    } else if (choice < 99) {
        EXPECT_EQ(list.Remove(item), at != model.end());
        if (at != model.end()) model.erase(at);
    } else {
        list.Clear();
        model.clear();
    }
}

TEST(ListTest, BehavesLikeAPlainSequenceUnderRandomUse) {
    std::vector<int> objects(8); // few, so that duplicates are common
    std::mt19937 random(7);
    List<int> list;
    ASSERT_TRUE(list.Construct());
    std::vector<int*> model;
    for (int step = 0; step < 5000 && !HasFailure(); ++step) {
        Mutate(list, model, &objects[random() % objects.size()], static_cast<int>(random() % 100));
        std::vector<int*> items;
        for (int i = 0; i < list.GetCount(); ++i) items.push_back(list.GetAt(i));
        EXPECT_EQ(items, model) << "at step " << step;
        EXPECT_EQ(list.IsEmpty(), model.empty());
        EXPECT_EQ(list.GetAt(-1), nullptr);
        EXPECT_EQ(list.GetAt(list.GetCount()), nullptr);
    }
}

// Long enough that a removal which moves all the rest would be noticed.
TEST(ListTest, AQueueInSteadyUseKeepsItsStorageAndDrainsWithoutAllocating) {
    std::vector<int> objects(100'000);
    List<int> list;
    for (int& object : objects) ASSERT_TRUE(list.Add(&object));
    int warm = 0;
    for (int round = 0; round < 5; ++round) {
        if (round == 2) warm = Testing::GetAllocationCount();
        for (int& object : objects) {
            ASSERT_EQ(list.RemoveAt(0), &object);
            ASSERT_TRUE(list.Add(&object));
        }
    }
    while (!list.IsEmpty()) {
        ASSERT_NE(list.RemoveAt(0), nullptr);
        ASSERT_NE(list.RemoveAt(list.GetCount() - 1), nullptr);
    }
    EXPECT_EQ(Testing::GetAllocationCount(), warm);
}

TEST(BitmapTest, CopyIsOwnedAndTightAndLeavesTheSourceToTheCaller) {
    // Two rows at stride 12; the buffer ends with the last pixel, not with a whole stride.
    std::vector<unsigned char> pixels(12 + 8);
    std::iota(pixels.begin(), pixels.end(), static_cast<unsigned char>(0));
    for (bool const deleteBuffer : {false, true}) {
        Bitmap bitmap;
        bool constructed = true;
        {
            Testing::FailAllocations const fail;
            constructed = bitmap.Construct(pixels.data(), 2, 2, 12, 1, true, deleteBuffer);
        }
        EXPECT_FALSE(constructed) << "no memory for a copy";
        ASSERT_TRUE(bitmap.Construct(pixels.data(), 2, 2, 12, 1, true, deleteBuffer));
        unsigned char const* const copy = bitmap.GetBuffer();
        ASSERT_NE(copy, pixels.data());
        EXPECT_EQ(bitmap.GetStride(), 8);
        EXPECT_TRUE(bitmap.GetDeleteBuffer());
        EXPECT_EQ(std::vector<unsigned char>(copy, copy + 16),
                  (std::vector<unsigned char>{0, 1, 2, 3, 4, 5, 6, 7, 12, 13, 14, 15, 16, 17, 18, 19}));
    }
}

TEST(BitmapTest, RefusesBadArgumentsAndStaysUsable) {
    std::vector<unsigned char> pixels(16);
    struct Case {
        int width, height, stride, format;
    };
    int const max = std::numeric_limits<int>::max();
    Bitmap bitmap;
    EXPECT_FALSE(bitmap.Construct(nullptr, 2, 2, 8, 1, false, true));
    for (Case const& c : {Case{0, 2, 8, 1}, Case{2, 0, 8, 1}, Case{-2, 2, 8, 1}, Case{2, -2, 8, 1},
                          Case{2, 2, 7, 1}, Case{2, 2, -8, 1}, Case{2, 2, 8, 0}, Case{2, 2, 8, 2},
                          Case{1 << 30, 1, 0, 1}, Case{max, 1, max, 1}}) {
        EXPECT_FALSE(bitmap.Construct(pixels.data(), c.width, c.height, c.stride, c.format, false, true))
            << c.width << 'x' << c.height << " stride " << c.stride << " format " << c.format;
        EXPECT_EQ(bitmap.GetBuffer(), nullptr);
    }
    ASSERT_TRUE(bitmap.Construct(pixels.data(), 2, 2, 8, 1, false, false));
    EXPECT_FALSE(bitmap.Construct(pixels.data(), 1, 1, 4, 1, false, true)) << "has pixels already";
    EXPECT_EQ(bitmap.GetWidth(), 2);
    EXPECT_FALSE(bitmap.GetDeleteBuffer());
}

} // namespace
} // namespace Moka
