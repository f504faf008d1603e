// Allocation.h: lets a test see how a block is freed, and make allocations fail. The program that links
// Allocation.cpp allocates through it everywhere, in the libraries under test too.
#pragma once

namespace Moka::Testing {

// While one exists, every operator new of the thread that made it fails. Collect results in the scope and
// assert after it, since assertions allocate.
class FailAllocations {
public:
    FailAllocations();
    ~FailAllocations();
    FailAllocations(FailAllocations const&) = delete;
    FailAllocations& operator=(FailAllocations const&) = delete;
};

// Counts how often one block is given to operator delete[], and to the plain operator delete. One at a time.
class DeleteWatch {
public:
    explicit DeleteWatch(void const* block);
    ~DeleteWatch();
    DeleteWatch(DeleteWatch const&) = delete;
    DeleteWatch& operator=(DeleteWatch const&) = delete;

    int GetArrayDeletes() const;
    int GetPlainDeletes() const;
};

// The operator new calls of the calling thread so far.
int GetAllocationCount();

} // namespace Moka::Testing
