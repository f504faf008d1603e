// Puts the memory of tasks, which they have of their own (TaskMemory.h), under the control of Allocation.h: the
// linker's names for the wrapped functions and the real ones.
#include "tests/support/Allocation.h"

using Moka::Testing::Faults;

extern "C" {
void* __real__ZN4Moka6detail12AllocateTaskEm(std::size_t size);
void __real__ZN4Moka6detail8FreeTaskEPvm(void* memory, std::size_t size);
void __real__ZN4Moka6detail8FreeTaskEPv(void* memory);

void* __wrap__ZN4Moka6detail12AllocateTaskEm(std::size_t size) {
    bool const fails = Faults::Fails(Faults::Kind::Tasks);
    void* const block = fails ? nullptr : __real__ZN4Moka6detail12AllocateTaskEm(size);
    Faults::AddLive(Faults::Kind::Tasks, block ? 1 : 0);
    return block;
}
void __wrap__ZN4Moka6detail8FreeTaskEPvm(void* memory, std::size_t size) {
    Faults::AddLive(Faults::Kind::Tasks, memory ? -1 : 0);
    __real__ZN4Moka6detail8FreeTaskEPvm(memory, size);
}
void __wrap__ZN4Moka6detail8FreeTaskEPv(void* memory) {
    Faults::AddLive(Faults::Kind::Tasks, memory ? -1 : 0);
    __real__ZN4Moka6detail8FreeTaskEPv(memory);
}
}
