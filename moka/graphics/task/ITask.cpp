#include "moka/graphics/task/ITask.h"

#include "moka/graphics/task/TaskMemory.h"

namespace Moka {

void* ITask::operator new(std::size_t size, std::nothrow_t const&) noexcept {
    return detail::AllocateTask(size);
}

void ITask::operator delete(void* memory, std::size_t size) noexcept { detail::FreeTask(memory, size); }

void ITask::operator delete(void* memory, std::nothrow_t const&) noexcept { detail::FreeTask(memory); }

} // namespace Moka
