#include "tests/app/ToolTest.h"

#include "tests/support/ImageCompare.h"

#include <algorithm>
#include <iterator>
#include <sstream>

namespace Moka::Testing {

namespace fs = std::filesystem;

Arguments::Arguments(char const* line) {
    std::istringstream words(line);
    assign(std::istream_iterator<std::string>(words), {});
    std::replace(begin(), end(), std::string("EMPTY"), std::string());
}

ProcessOptions WithoutDriver() {
    ProcessOptions options;
    options.environment = {"__EGL_VENDOR_LIBRARY_DIRS=/nonexistent"};
    return options;
}

void ToolTest::Save(Picture const& image, std::string const& name, int quality) const {
    ASSERT_TRUE(SaveImage(image, Path(name), quality));
}

void ToolTest::Truncate(std::string const& name) const {
    fs::resize_file(Path(name), fs::file_size(Path(name)) / 2);
}

ProcessResult ToolTest::Run(Arguments const& arguments, ProcessOptions const& options) const {
    return MokaProcess(mFolder.string(), arguments, options).Wait();
}

std::string ToolTest::RunWell(Arguments const& arguments, ProcessOptions const& options) const {
    ProcessResult const result = Run(arguments, options);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    return result.out;
}

void ToolTest::ExpectFails(Arguments const& arguments, int status, std::string const& parts,
                           ProcessOptions const& options) const {
    // With the time of the last change, which shows what was replaced by the same.
    auto const look = [this] {
        std::vector<std::pair<fs::path, fs::file_time_type>> files;
        for (auto const& entry : fs::recursive_directory_iterator(mFolder))
            files.emplace_back(entry.path(), entry.last_write_time());
        std::sort(files.begin(), files.end());
        return files;
    };
    auto const before = look();
    ProcessResult const result = Run(arguments, options);
    SCOPED_TRACE(::testing::PrintToString(arguments) + " said: " + result.err);
    EXPECT_EQ(result.status, status);
    EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1);
    EXPECT_EQ(result.err.rfind("moka: ", 0), 0u);
    std::istringstream each(parts);
    for (std::string part; std::getline(each, part, '|');)
        EXPECT_THAT(result.err, ::testing::HasSubstr(part));
    EXPECT_EQ(result.out, "");
    EXPECT_TRUE(look() == before);
}

void ToolTest::ExpectSamePixels(Picture const& image, std::string const& name) const {
    Picture const written = Load(name);
    ASSERT_GT(written.width, 0) << name;
    EXPECT_EQ(CompareImages(image, written).differingPixels, 0) << name;
}

} // namespace Moka::Testing
