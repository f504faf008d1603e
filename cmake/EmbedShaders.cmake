# Run at build time: writes GLSL files into a C++ header.
#   cmake -DOUTPUT=header -DFOLDER=folder "-DPROGRAMS=Class:file.vert:file.frag;..."
#     -P EmbedShaders.cmake
# For each class the header defines kClassVertex and kClassFragment.
# A file that several programs use is embedded once.
cmake_minimum_required(VERSION 3.25)

set(texts "")
set(programs "")
set(embedded "")

# The name of a file's constant: kText_bitmap_vert.
function(embed file result)
  string(MAKE_C_IDENTIFIER "kText_${file}" name)
  set(${result} ${name} PARENT_SCOPE)
  if(name IN_LIST embedded)
    return()
  endif()
  file(READ "${FOLDER}/${file}" text)
  set(texts "${texts}inline constexpr char ${name}[] = R\"glsl(${text})glsl\";\n\n" PARENT_SCOPE)
  set(embedded ${embedded} ${name} PARENT_SCOPE)
endfunction()

foreach(program IN LISTS PROGRAMS)
  string(REPLACE ":" ";" parts ${program})
  list(POP_FRONT parts class vertex fragment)
  embed(${vertex} vertexName)
  embed(${fragment} fragmentName)
  string(APPEND programs
    "inline constexpr char const* k${class}Vertex = ${vertexName};\n"
    "inline constexpr char const* k${class}Fragment = ${fragmentName};\n")
endforeach()

file(WRITE "${OUTPUT}" "// Made by the build.\n#pragma once\n\n"
  "namespace Moka::detail {\n\n${texts}${programs}\n} // namespace Moka::detail\n")
