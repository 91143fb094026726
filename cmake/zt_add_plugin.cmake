# zt_add_plugin(NAME name KIND kind|EXTENSION ext SOURCES file...
#               [LIBRARIES library...] [HELP file...] [NO_INSTALL])
#
# Builds the plug-in NAME.<extension>.so, one that refers to nothing that is
# not there and shows nothing but what ZT_PLUGIN defines. KIND is
#
#   recognizer  name.r.so, for KvoRecognizerCatalog
#   directive   name.d.so, for ZtDirectiveCatalog
#
# A host with kinds of its own gives the EXTENSION instead.
#
# HELP files, Plug.<extension>.txt for what it registers as Plug, go to a
# folder Help beside it.
#
# All is installed to <library folder>/zt_util2/plugins, unless NO_INSTALL says
# that somebody else does it. Where tests are enabled, the test NAME_loads has
# `ztsh plugin check` load it, register its plugs and unload it again.
#
# Works in the tree of the library and with find_package(zt_util2) alike.

# Where this file is, for functions that are called from elsewhere.
set(ZT_ADD_PLUGIN_DIR ${CMAKE_CURRENT_LIST_DIR})

# Sets `out` to the command that runs the shell; empty if there is none.
function(zt_find_ztsh out)
  if(TARGET ztsh)
    set(${out} $<TARGET_FILE:ztsh> PARENT_SCOPE)
    return()
  endif()
  # The folder of this file is some levels below the prefix: how many depends
  # on the name of the library folder.
  find_program(ZT_ZTSH ztsh HINTS
    ${ZT_ADD_PLUGIN_DIR}/../../../bin ${ZT_ADD_PLUGIN_DIR}/../../../../bin)
  if(ZT_ZTSH)
    set(${out} ${ZT_ZTSH} PARENT_SCOPE)
  else()
    set(${out} "" PARENT_SCOPE)
  endif()
endfunction()

function(zt_add_plugin)
  cmake_parse_arguments(PARSE_ARGV 0 arg "NO_INSTALL" "NAME;KIND;EXTENSION"
                        "SOURCES;LIBRARIES;HELP")
  if(arg_UNPARSED_ARGUMENTS OR NOT arg_NAME OR NOT arg_SOURCES)
    message(FATAL_ERROR "zt_add_plugin: NAME and SOURCES are needed; "
                        "not known: ${arg_UNPARSED_ARGUMENTS}")
  endif()
  set(extension_of_recognizer r)
  set(extension_of_directive d)
  if(NOT arg_EXTENSION)
    set(arg_EXTENSION "${extension_of_${arg_KIND}}")
  endif()
  if(NOT arg_EXTENSION)
    message(FATAL_ERROR "zt_add_plugin: KIND is recognizer or directive, "
                        "not '${arg_KIND}'")
  endif()

  add_library(${arg_NAME} MODULE ${arg_SOURCES})
  target_compile_features(${arg_NAME} PRIVATE cxx_std_17)
  target_link_libraries(${arg_NAME} PRIVATE zt::util2 ${arg_LIBRARIES})
  # A missing function is told by the linker, and by the loader if it is gone
  # later, instead of ending the program that calls it.
  target_link_options(${arg_NAME} PRIVATE LINKER:-z,now LINKER:-z,defs)
  set_target_properties(${arg_NAME} PROPERTIES
    PREFIX "" SUFFIX .${arg_EXTENSION}.so
    CXX_VISIBILITY_PRESET hidden VISIBILITY_INLINES_HIDDEN ON)
  # A symbol that there is one of in a whole process keeps its plug-in in
  # memory for ever.
  target_compile_options(${arg_NAME} PRIVATE
    $<$<CXX_COMPILER_ID:GNU>:-fno-gnu-unique>)

  file(MAKE_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR}/Help)
  foreach(file IN LISTS arg_HELP)
    configure_file(${file} ${CMAKE_CURRENT_BINARY_DIR}/Help/ COPYONLY)
  endforeach()
  if(NOT arg_NO_INSTALL)
    include(GNUInstallDirs)
    set(folder ${CMAKE_INSTALL_LIBDIR}/zt_util2/plugins)
    install(TARGETS ${arg_NAME} LIBRARY DESTINATION ${folder})
    install(FILES ${arg_HELP} DESTINATION ${folder}/Help)
  endif()

  zt_find_ztsh(ztsh)
  if(CMAKE_TESTING_ENABLED AND ztsh)
    set(kind "")
    if(arg_KIND)
      set(kind --kind ${arg_KIND})
    endif()
    add_test(NAME ${arg_NAME}_loads
      COMMAND ${ztsh} plugin check ${kind} $<TARGET_FILE:${arg_NAME}>)
    set_tests_properties(${arg_NAME}_loads PROPERTIES TIMEOUT 60)
  endif()
endfunction()
