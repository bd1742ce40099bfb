# velmora_embed_pictures(TARGET) compiles the grey pictures of render/pictures into TARGET. They are checked
# meanwhile: a wrong size, format or key fails the build with the name of the file.

find_package(Python3 REQUIRED COMPONENTS Interpreter)

function(velmora_embed_pictures target)
  set(folder ${PROJECT_SOURCE_DIR}/render/pictures)
  set(script ${PROJECT_SOURCE_DIR}/cmake/embed_pictures.py)
  set(source ${CMAKE_CURRENT_BINARY_DIR}/embedded_pictures.cpp)
  file(GLOB wear CONFIGURE_DEPENDS ${folder}/wear-*.pgm)
  file(GLOB spots CONFIGURE_DEPENDS ${folder}/spot-*.pgm)
  add_custom_command(
    OUTPUT ${source}
    COMMAND ${Python3_EXECUTABLE} ${script} ${folder} ${source} ${wear}
    DEPENDS ${script} ${wear} ${spots}
    COMMENT "Embedding the wear pictures and spots"
    VERBATIM)
  target_sources(${target} PRIVATE ${source})
endfunction()
