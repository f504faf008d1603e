# For find_package(MokaGraphics): the targets Moka::moka_graphics, Moka::moka_host and what they need.
include(CMakeFindDependencyMacro)
find_dependency(Threads)
include(${CMAKE_CURRENT_LIST_DIR}/MokaGraphicsTargets.cmake)
