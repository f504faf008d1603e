// What a test asks about records as a whole: the draws, and whether any are kept.
#include "tests/support/RecordingDraws.h"

#include "tests/support/RecordingObjects.h"

#include <utility>

namespace Moka::Testing {

using namespace detail;

namespace {

template <class Event>
std::vector<Event> GetEventsOf() {
    DeviceAccess const device;
    std::vector<Event> result;
    for (RecordedEvent const& event : device->events) {
        if (auto const* const found = std::get_if<Event>(&event)) result.push_back(*found);
    }
    return result;
}

} // namespace

std::vector<RecordedDraw> RecordingRenderer::GetDraws() { return GetEventsOf<RecordedDraw>(); }

std::vector<RecordedClear> RecordingRenderer::GetClears() { return GetEventsOf<RecordedClear>(); }

std::vector<RecordedEvent> RecordingRenderer::GetEvents() {
    DeviceAccess const device;
    return device->events;
}

std::vector<RecordedEvent> RecordingRenderer::TakeEvents() {
    DeviceAccess const device;
    return std::exchange(device->events, {});
}

PipelineState RecordingRenderer::GetState() {
    DeviceAccess const device;
    return device->state;
}

void RecordingRenderer::KeepRecords(bool keep) {
    DeviceAccess const device;
    device->keepsRecords = keep;
    if (keep) return;
    device->calls = {};
    device->events = {};
    device->FreeReleased();
}

} // namespace Moka::Testing
