// FileFaults: makes file operations of the process fail or fall short. The program that links FileFaults.cpp
// makes its calls for files through it, in the libraries under test too.
// Thread: one.
#pragma once

#include <string>

namespace Moka::Testing {

class FileFaults {
public:
    enum class Mode {
        Fail,     // the k-th call fails with the error
        FailAll,  // all from the k-th on do
        Short,    // every read or write does at most 7 bytes, and is interrupted every third time
        Truncate, // all reads from the k-th on find the end of the file
    };

    static void Arm(Mode mode, int k, int error);
    // How many calls there were since.
    static int Disarm();
    // Their names, in order: "open write fsync close ".
    static std::string const& GetCalls();
};

} // namespace Moka::Testing
