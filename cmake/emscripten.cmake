# WebAssembly with Debian's emscripten: what the page in the browser runs.

# The linker's script looks for its own modules only where this variable says, when another node is first on the path.
set(ENV{NODE_PATH} /usr/share/nodejs)
include(/usr/share/emscripten/cmake/Modules/Platform/Emscripten.cmake)

# Vectors of 16 bytes; emscripten has the operations of SSSE3 for them. Its C++ library lacks two things of ours, and tables
# of shapes take its compiler more steps than it grants by itself.
set(CMAKE_CXX_FLAGS_INIT "-msimd128 -mssse3 -fconstexpr-steps=100000000 -include ${CMAKE_CURRENT_LIST_DIR}/../faces/web/older_library.h")
