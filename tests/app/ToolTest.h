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

// Before the tool's name, for a process that finds no driver.
constexpr char const* kWithoutDriver = "__EGL_VENDOR_LIBRARY_DIRS=/nonexistent";

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

    // Starts the tool with these arguments, which the shell reads. `before` stands before the tool's name: variables,
    // or commands that end with a semicolon.
    MokaProcess Start(std::string const& arguments, std::string const& before = {}) const;
    ProcessResult Run(std::string const& arguments, std::string const& before = {}) const {
        return Start(arguments, before).Wait();
    }
    // Fails the test unless the tool succeeds without a word on stderr.
    std::string RunWell(std::string const& arguments, std::string const& before = {}) const;
    // One line on stderr that holds every part (they are separated by bars), nothing on stdout, and the folder as it
    // was.
    void ExpectFails(std::string const& arguments, int status, std::string const& parts,
                     std::string const& before = {}) const;
    void ExpectSamePixels(Picture const& image, std::string const& name) const;

private:
    TempFolder mTemporary;

protected:
    std::filesystem::path const& mFolder = mTemporary.GetPath();
};

} // namespace Moka::Testing
