#include "tests/app/ToolTest.h"

#include "tests/support/ImageCompare.h"

#include <algorithm>
#include <sstream>

namespace Moka::Testing {

namespace fs = std::filesystem;

void ToolTest::Save(Picture const& image, std::string const& name, int quality) const {
    ASSERT_TRUE(SaveImage(image, Path(name), quality));
}

void ToolTest::Truncate(std::string const& name) const {
    fs::resize_file(Path(name), fs::file_size(Path(name)) / 2);
}

MokaProcess ToolTest::Start(std::string const& arguments, std::string const& before) const {
    return MokaProcess(mFolder.string(), before + " exec '" MOKA_EXECUTABLE "' " + arguments);
}

std::string ToolTest::RunWell(std::string const& arguments, std::string const& before) const {
    ProcessResult const result = Run(arguments, before);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    return result.out;
}

void ToolTest::ExpectFails(std::string const& arguments, int status, std::string const& parts,
                           std::string const& before) const {
    // With the time of the last change, which shows what was replaced by the same.
    auto const look = [this] {
        std::vector<std::pair<fs::path, fs::file_time_type>> found;
        for (auto const& entry : fs::recursive_directory_iterator(mFolder))
            found.emplace_back(entry.path(), entry.last_write_time());
        std::sort(found.begin(), found.end());
        return found;
    };
    auto const files = look();
    ProcessResult const result = Run(arguments, before);
    SCOPED_TRACE(arguments + " said: " + result.err);
    EXPECT_EQ(result.status, status);
    EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1);
    EXPECT_EQ(result.err.rfind("moka: ", 0), 0u);
    std::istringstream each(parts);
    for (std::string part; std::getline(each, part, '|');)
        EXPECT_THAT(result.err, ::testing::HasSubstr(part));
    EXPECT_EQ(result.out, "");
    EXPECT_TRUE(look() == files);
}

void ToolTest::ExpectSamePixels(Picture const& image, std::string const& name) const {
    Picture const written = Load(name);
    ASSERT_GT(written.width, 0) << name;
    EXPECT_EQ(CompareImages(image, written).differingPixels, 0) << name;
}

} // namespace Moka::Testing
