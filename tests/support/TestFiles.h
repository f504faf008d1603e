// TestFiles.h: image files of a test's own.
#pragma once

#include "tests/support/TestImages.h"

#include <filesystem>
#include <functional>
#include <string>
#include <vector>

namespace Moka::Testing {

// A folder that goes, with its files, at the end of its scope.
class TempFolder {
public:
    TempFolder();
    ~TempFolder();
    TempFolder(TempFolder const&) = delete;
    TempFolder& operator=(TempFolder const&) = delete;

    std::filesystem::path const& GetPath() const { return mPath; }
    std::string Path(std::string const& name) const { return (mPath / name).string(); }
    // Sorted; everything, hidden files as well.
    std::vector<std::string> List(std::string const& folder = ".") const;

private:
    std::filesystem::path mPath;
};

// Whether the condition holds within half a minute: the sanitizers and a cold disk take their time.
bool Soon(std::function<bool()> const& holds);

std::string ReadFile(std::string const& path);
void WriteFile(std::string const& path, std::string const& content);

// In the format of the path's extension. Whether it could.
[[nodiscard]] bool SaveImage(Picture const& image, std::string const& path, int quality = 100);
// Empty when it cannot be decoded.
Picture LoadImage(std::string const& path);

} // namespace Moka::Testing
