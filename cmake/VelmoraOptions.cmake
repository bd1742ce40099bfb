# Options shared by every target of the project, on one interface target.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
if(NOT EMSCRIPTEN)  # a module of its own is not moved
  set(CMAKE_POSITION_INDEPENDENT_CODE ON)
endif()
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

option(VELMORA_SANITIZE "Build with address and undefined-behaviour sanitizers" OFF)
option(VELMORA_SANITIZE_THREADS "Build with the thread sanitizer" OFF)
option(VELMORA_FUZZ "Build the fuzzing programs (clang only), all code with sanitizers" OFF)
set(VELMORA_DIST ${CMAKE_BINARY_DIR}/dist)

add_library(velmora_options INTERFACE)
target_include_directories(velmora_options INTERFACE ${CMAKE_SOURCE_DIR})
target_compile_options(velmora_options INTERFACE
  -Wall -Wextra -Wconversion -Wshadow -Wnon-virtual-dtor -Wold-style-cast -Werror
  # GCC 12 wrongly reports an overlap in `"text" + string`.
  $<$<CXX_COMPILER_ID:GNU>:-Wno-restrict>
  # Results must not depend on the build: no fused multiply-add, no relaxed maths.
  -ffp-contract=off -fno-fast-math)
# Shipped files must not depend on the folder or the time of the build.
if(CMAKE_BUILD_TYPE STREQUAL "Release")
  target_compile_options(velmora_options INTERFACE
    -ffile-prefix-map=${CMAKE_SOURCE_DIR}=. -ffile-prefix-map=${CMAKE_BINARY_DIR}=build)
endif()
if(VELMORA_SANITIZE)
  target_compile_options(velmora_options INTERFACE
    -fsanitize=address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer
    # With sanitizers, GCC 12 reports variables in its own vector intrinsics as uninitialised.
    -Wno-uninitialized)
  target_link_options(velmora_options INTERFACE -fsanitize=address,undefined)
endif()
if(VELMORA_SANITIZE_THREADS)
  target_compile_options(velmora_options INTERFACE -fsanitize=thread -fno-omit-frame-pointer)
  target_link_options(velmora_options INTERFACE -fsanitize=thread)
endif()
if(VELMORA_FUZZ)
  target_compile_options(velmora_options INTERFACE
    -fsanitize=fuzzer-no-link,address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer)
  target_link_options(velmora_options INTERFACE -fsanitize=address,undefined)
endif()
if(WIN32)
  target_compile_definitions(velmora_options INTERFACE
    UNICODE _UNICODE NOMINMAX WIN32_LEAN_AND_MEAN STRICT _WIN32_WINNT=0x0601)
  # Runtime libraries are linked statically: the product needs only Windows' own modules.
  target_link_options(velmora_options INTERFACE -static -static-libgcc -static-libstdc++)
  target_link_options(velmora_options INTERFACE $<$<CONFIG:Release>:-s> -Wl,--no-insert-timestamp)
elseif(NOT EMSCRIPTEN)
  target_link_options(velmora_options INTERFACE -Wl,-z,relro -Wl,-z,now)
endif()
