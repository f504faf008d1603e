// Scenarios: what callers do with the library, each from nothing to nothing. The sweeps run them with one
// thing after another failing, so each takes null for an answer.
#pragma once

#include "moka/graphics/task/IGLMsgQueue.h"

#include <functional>
#include <string>
#include <vector>

namespace Moka::Testing {

// The world of a scenario.
struct Stage {
    IGLMsgQueue& queue;
    std::function<void()> settle; // until everything posted so far has run
    std::string folder;           // for files, without a slash; "picture.png" lies there
};

struct Scenario {
    std::string name;
    std::function<void(Stage const&)> run;
};

// One for each file of tests/trust/scenes, which is drawn and read back, and what no scene says.
std::vector<Scenario> GetScenarios();

// Loads and saves with the loader. Not among the others, since it waits for every callback, and a save whose
// read-back is refused calls nobody, as callers know.
Scenario GetLoaderScenario();

} // namespace Moka::Testing
