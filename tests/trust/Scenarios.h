// Scenarios: what callers do with the library, each from nothing to nothing. The sweeps run them with one
// thing after another failing, so each takes null for an answer; others run them in an order drawn at random.
#pragma once

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/task/IGLMsgQueue.h"

#include <functional>
#include <random>
#include <string>
#include <vector>

namespace Moka::Testing {

// The world of a scenario.
struct Stage {
    IGLMsgQueue& queue;
    std::function<void()> settle; // until everything posted so far has run
    std::string folder;           // for files, without a slash; "picture.png" lies there
    IMKBitmap* shared = nullptr;  // drawn and cloned by several callers at once, where there is one
};

struct Scenario {
    std::string name;
    std::function<void(Stage const&)> run;
};

// The largest texture with which every scene has room, and the tall bitmaps of the others have strips.
constexpr int kMaxTexture = 640;

// The registry's scenes, those that take much time or a pen aside, and what no scene says. The last one loads, draws and
// saves with the loader, and waits for every callback: a save whose read-back is refused calls nobody.
std::vector<Scenario> const& GetScenarios();
std::vector<Scenario> FindScenarios(std::vector<std::string> const& names);

// Any but the last.
void RunAnyScenario(Stage const& stage, std::mt19937& random);

} // namespace Moka::Testing
