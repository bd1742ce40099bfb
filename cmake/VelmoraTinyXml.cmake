# velmora_tinyxml: TinyXML 2.6.2 with Debian's patches (std::string in its interface) for both builds. Native code
# links Debian's library; Debian has none for Windows, so there it is compiled from the sources that
# scripts/fetch-tinyxml unpacked in the cache folder. The fuzzing programs also compile them: a fuzzer sees only the
# branches of code that was compiled with it.

if(NOT WIN32 AND NOT VELMORA_FUZZ)
  add_library(velmora_tinyxml INTERFACE)
  find_path(VELMORA_TINYXML_INCLUDE tinyxml.h REQUIRED)
  find_library(VELMORA_TINYXML_LIBRARY tinyxml REQUIRED)
  target_include_directories(velmora_tinyxml SYSTEM INTERFACE ${VELMORA_TINYXML_INCLUDE})
  target_link_libraries(velmora_tinyxml INTERFACE ${VELMORA_TINYXML_LIBRARY})
else()
  execute_process(
    COMMAND bash -c "source scripts/common.sh && printf %s \"$tinyxmlSource\""
    WORKING_DIRECTORY ${PROJECT_SOURCE_DIR} OUTPUT_VARIABLE folder COMMAND_ERROR_IS_FATAL ANY)
  if(NOT EXISTS ${folder}/tinyxml.cpp)
    message(FATAL_ERROR "The sources of TinyXML are not in ${folder}: run scripts/setup")
  endif()
  # Its parser leaks the node that it is parsing when memory runs out, so each such node gets an owner meanwhile.
  file(READ ${folder}/tinyxmlparser.cpp parser)
  foreach(call "node->Parse( p, &data" "node->Parse( p, data" "attrib->Parse( p, data" "textNode->Parse( p, data"
      "textNode->Parse( pWithWhiteSpace, data")
    string(REGEX MATCH "^[a-zA-Z]+" pointer "${call}")
    set(bare "p = ${call}, encoding );")
    string(FIND "${parser}" "${bare}" place)
    if(place EQUAL -1)
      message(FATAL_ERROR "TinyXML's parser has changed: there is no ${bare}")
    endif()
    string(REPLACE "${bare}" "{ std::unique_ptr<std::remove_pointer_t<decltype(${pointer})>> owner( ${pointer} ); ${bare} owner.release(); }"
      parser "${parser}")
  endforeach()
  set(made ${CMAKE_BINARY_DIR}/tinyxml/tinyxmlparser.cpp)
  file(CONFIGURE OUTPUT ${made} CONTENT "#include <memory>\n#include <type_traits>\n@parser@" @ONLY)
  unset(parser)
  add_library(velmora_tinyxml STATIC EXCLUDE_FROM_ALL
    ${folder}/tinyxml.cpp ${folder}/tinyxmlerror.cpp ${made})
  unset(made)
  target_include_directories(velmora_tinyxml SYSTEM PUBLIC ${folder})
  # We do not fix its warnings.
  target_compile_options(velmora_tinyxml PRIVATE -w)
  if(VELMORA_FUZZ)
    target_compile_options(velmora_tinyxml PRIVATE -fsanitize=fuzzer-no-link,address,undefined -fno-sanitize-recover=all)
  endif()
  unset(folder)
endif()
