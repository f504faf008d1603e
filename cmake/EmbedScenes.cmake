# Run at build time: writes scene files into a C++ source.
#   cmake -DOUTPUT=source -DFOLDER=folder "-DFILES=name.json;..." -P EmbedScenes.cmake
# The result defines kSceneTexts of scenes/SceneTexts.h: the name without its extension, and the text.
cmake_minimum_required(VERSION 3.25)

set(texts "")
foreach(file IN LISTS FILES)
  file(READ "${FOLDER}/${file}" text)
  cmake_path(GET file STEM name)
  string(APPEND texts "    {\"${name}\", R\"scene(${text})scene\"},\n")
endforeach()

list(LENGTH FILES count)
file(WRITE "${OUTPUT}" "// Made by the build.\n#include \"scenes/SceneTexts.h\"\n\n"
  "namespace Moka::Scenes {\n\nSceneText const kSceneTexts[] = {\n${texts}};\n"
  "std::size_t const kSceneTextCount = ${count};\n\n} // namespace Moka::Scenes\n")
