// NoPixelMemory: while one lives, a non-throwing array new fails on its thread. Pixels come from those.
// GetLiveArrays: what this thread's array new has given, less what its array delete took.
// Linking this replaces array new and delete.
#pragma once

namespace Moka::Testing {

class NoPixelMemory {
public:
    NoPixelMemory();
    ~NoPixelMemory();
    NoPixelMemory(NoPixelMemory const&) = delete;
    NoPixelMemory& operator=(NoPixelMemory const&) = delete;
};

int GetLiveArrays();

} // namespace Moka::Testing
