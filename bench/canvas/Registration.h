// Registration.h: registers the benchmarks that are generated from tables. main calls these functions,
// because the scenes depend on static objects.
#pragma once

namespace Moka::Bench {

void RegisterPrimitives();
void RegisterScenes();

} // namespace Moka::Bench
