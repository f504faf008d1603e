// ToolTest.h: a folder for each test, pictures in it, and the tool at work there.
#pragma once

#include "tests/app/MokaProcess.h"
#include "tests/support/TestFiles.h"

#include <filesystem>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace Moka::Testing {

constexpr int kFailed = 1;
constexpr int kUsage = 2;

// Words of a command line, or one by one where they hold spaces. EMPTY stands for an empty one.
struct Arguments : std::vector<std::string> {
    using vector::vector;
    Arguments(char const* line);
    Arguments(std::string const& line) : Arguments(line.c_str()) {}
};

// The options of a process that finds no driver.
ProcessOptions WithoutDriver();

class ToolTest : public ::testing::Test {
protected:
    // Names are relative to the test's folder throughout.
    std::string Path(std::string const& name) const { return (mFolder / name).string(); }
    void Save(Picture const& image, std::string const& name, int quality = 100) const;
    void WriteFile(std::string const& name, std::string const& content) const {
        Testing::WriteFile(Path(name), content);
    }
    std::string ReadFile(std::string const& name) const { return Testing::ReadFile(Path(name)); }
    // Cut off after half of its bytes.
    void Truncate(std::string const& name) const;
    // Empty when the file cannot be decoded.
    Picture Load(std::string const& name) const { return LoadImage(Path(name)); }
    // Sorted; everything, hidden files as well.
    std::vector<std::string> List(std::string const& folder = ".") const { return mTemporary.List(folder); }

    ProcessResult Run(Arguments const& arguments, ProcessOptions const& options = {}) const;
    // Fails the test unless the tool succeeds without a word on stderr.
    std::string RunWell(Arguments const& arguments, ProcessOptions const& options = {}) const;
    // One line on stderr that holds every part (they are separated by bars), nothing on stdout, and the folder as it
    // was.
    void ExpectFails(Arguments const& arguments, int status, std::string const& parts,
                     ProcessOptions const& options = {}) const;
    void ExpectSamePixels(Picture const& image, std::string const& name) const;

private:
    TempFolder mTemporary;

protected:
    std::filesystem::path const& mFolder = mTemporary.GetPath();
};

} // namespace Moka::Testing
