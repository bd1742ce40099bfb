# velmora_add_test(NAME SOURCES... LIBS ...) builds one GoogleTest program and registers it with CTest under its name.
# A program is one CTest entry, because programs take seconds to start under Wine.

include(CTest)

if(BUILD_TESTING)
  # GoogleTest's sources come from the system's package, so that both builds use the same version.
  set(INSTALL_GTEST OFF)
  add_subdirectory(/usr/src/googletest ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
  # We do not fix its warnings.
  foreach(library gtest gtest_main gmock gmock_main)
    target_compile_options(${library} PRIVATE -w)
  endforeach()
endif()

function(velmora_add_test name)
  cmake_parse_arguments(ARG "" "" "SOURCES;LIBS;LABELS;ARGS" ${ARGN})
  add_executable(${name} ${ARG_SOURCES})
  target_link_libraries(${name} PRIVATE velmora_options ${ARG_LIBS} GTest::gtest_main GTest::gmock)
  add_test(NAME ${name} COMMAND ${name} ${ARG_ARGS})
  set_tests_properties(${name} PROPERTIES TIMEOUT 600)
  if(ARG_LABELS)
    set_tests_properties(${name} PROPERTIES LABELS "${ARG_LABELS}")
  endif()
endfunction()

# velmora_test_levels(NAME ARGUMENT...) runs a test program once more on each SIMD level, as far as the processor has it.
function(velmora_test_levels name)
  foreach(level plain sse2 ssse3 avx2 avx512)
    add_test(NAME ${name}_${level} COMMAND ${name} ${ARGN})
    set_tests_properties(${name}_${level} PROPERTIES TIMEOUT 600 ENVIRONMENT VELMORA_SIMD=${level})
    if(WIN32)
      set_tests_properties(${name}_${level} PROPERTIES RESOURCE_LOCK screen)
    endif()
  endforeach()
endfunction()

# velmora_check_module(TARGET EXPORT...) or (TARGET HOSTS MODULE... EXPORTS EXPORT...) checks that a Windows module exports
# exactly the given names and imports only Windows' own modules and those of its host.
function(velmora_check_module target)
  if(WIN32 AND BUILD_TESTING)
    cmake_parse_arguments(ARG "" "" "HOSTS;EXPORTS" ${ARGN})
    set(options)
    if(CMAKE_SIZEOF_VOID_P EQUAL 8)
      list(APPEND options --64)
    endif()
    foreach(host ${ARG_HOSTS})
      list(APPEND options --host ${host})
    endforeach()
    add_test(NAME ${target}_imports
      COMMAND ${PROJECT_SOURCE_DIR}/scripts/check-imports ${options} $<TARGET_FILE:${target}>
        ${ARG_EXPORTS} ${ARG_UNPARSED_ARGUMENTS})
  endif()
endfunction()
