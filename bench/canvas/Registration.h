// Registration.h: the benchmarks that are made from tables. Called in main, because the scenes need what is
// initialised before it.
#pragma once

namespace Moka::Bench {

void RegisterPrimitives();
void RegisterScenes();

} // namespace Moka::Bench
