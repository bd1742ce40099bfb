# velmora_version_resource(TARGET DESCRIPTION FILENAME) gives a Windows program or module its version resource, which
# Explorer's "Details" page and installers show. Does nothing in native builds.

if(WIN32)
  enable_language(RC)
endif()

function(velmora_version_resource target description filename)
  if(NOT WIN32)
    return()
  endif()
  get_target_property(type ${target} TYPE)
  set(fileType VFT_DLL)
  if(type STREQUAL "EXECUTABLE")
    set(fileType VFT_APP)
  endif()
  get_filename_component(internalName ${filename} NAME_WE)
  set(resource ${CMAKE_CURRENT_BINARY_DIR}/${target}-version.rc)
  configure_file(${PROJECT_SOURCE_DIR}/cmake/version.rc.in ${resource} @ONLY)
  target_sources(${target} PRIVATE ${resource})
endfunction()
