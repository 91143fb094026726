# What `cmake --install` puts where, in four components:
#
#   runtime  the shared library and the library's own plug-ins
#   dev      headers, the static library, files for CMake and pkg-config
#   tools    the programs of tools/, their man pages and completions
#   doc      guides, examples and, once scripts/make-docs was run, the reference
#
# A new header, tool, plug-in or guide needs no line here. The tree may be
# moved: everything in it finds the rest by relative paths.
include(CMakePackageConfigHelpers)

set(ZT_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/zt_util2)
set(ZT_PC_DIR ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
set(ZT_PLUGIN_DIR ${CMAKE_INSTALL_LIBDIR}/zt_util2/plugins)
file(RELATIVE_PATH ZT_PREFIX_FROM_PC /prefix/${ZT_PC_DIR} /prefix)
string(REGEX REPLACE "/$" "" ZT_PREFIX_FROM_PC ${ZT_PREFIX_FROM_PC})

# Sets `out` to the targets of a type that `folder` and what is below it make.
function(zt_targets_below folder type out)
  set(found "")
  get_property(targets DIRECTORY ${folder} PROPERTY BUILDSYSTEM_TARGETS)
  foreach(target IN LISTS targets)
    get_target_property(target_type ${target} TYPE)
    if(target_type STREQUAL type)
      list(APPEND found ${target})
    endif()
  endforeach()
  get_property(below DIRECTORY ${folder} PROPERTY SUBDIRECTORIES)
  foreach(subfolder IN LISTS below)
    zt_targets_below(${subfolder} ${type} more)
    list(APPEND found ${more})
  endforeach()
  set(${out} ${found} PARENT_SCOPE)
endfunction()

# The same, of the whole folder tools/ or plugins/ of the project.
function(zt_targets_of name type out)
  set(found "")
  get_property(folders DIRECTORY ${PROJECT_SOURCE_DIR} PROPERTY SUBDIRECTORIES)
  foreach(folder IN LISTS folders)
    cmake_path(RELATIVE_PATH folder BASE_DIRECTORY ${PROJECT_SOURCE_DIR}
               OUTPUT_VARIABLE relative)
    if(relative MATCHES "^${name}(/|$)")
      zt_targets_below(${folder} ${type} more)
      list(APPEND found ${more})
    endif()
  endforeach()
  set(${out} ${found} PARENT_SCOPE)
endfunction()

# Lets programs or plug-ins find the library from the folder they go to.
function(zt_find_library_from folder)
  file(RELATIVE_PATH way /prefix/${folder} /prefix/${CMAKE_INSTALL_LIBDIR})
  string(REGEX REPLACE "/$" "" way "${way}")
  set_target_properties(${ARGN} PROPERTIES INSTALL_RPATH "$ORIGIN/${way}")
endfunction()

# runtime
install(TARGETS zt_util2 EXPORT zt_util2Targets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime
  NAMELINK_COMPONENT dev)
zt_targets_of(plugins MODULE_LIBRARY plugins)
if(plugins)
  zt_find_library_from(${ZT_PLUGIN_DIR} ${plugins})
  install(TARGETS ${plugins}
    LIBRARY DESTINATION ${ZT_PLUGIN_DIR} COMPONENT runtime)
endif()

# dev
install(TARGETS zt_util2_static EXPORT zt_util2_staticTargets
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT dev)
install(DIRECTORY include/KVO include/ZT
  DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT dev
  FILES_MATCHING PATTERN "*.h")
foreach(export zt_util2Targets zt_util2_staticTargets)
  install(EXPORT ${export} NAMESPACE zt:: DESTINATION ${ZT_CMAKE_DIR}
    COMPONENT dev)
endforeach()
configure_package_config_file(cmake/zt_util2Config.cmake.in
  ${PROJECT_BINARY_DIR}/zt_util2Config.cmake
  INSTALL_DESTINATION ${ZT_CMAKE_DIR}
  PATH_VARS CMAKE_INSTALL_INCLUDEDIR ZT_PLUGIN_DIR)
write_basic_package_version_file(
  ${PROJECT_BINARY_DIR}/zt_util2ConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/zt_util2Config.cmake
  ${PROJECT_BINARY_DIR}/zt_util2ConfigVersion.cmake
  DESTINATION ${ZT_CMAKE_DIR} COMPONENT dev)
install(FILES cmake/zt_add_plugin.cmake
  DESTINATION ${ZT_CMAKE_DIR} COMPONENT dev)
configure_file(cmake/zt_util2.pc.in ${PROJECT_BINARY_DIR}/zt_util2.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/zt_util2.pc
  DESTINATION ${ZT_PC_DIR} COMPONENT dev)

# tools
zt_targets_of(tools EXECUTABLE tools)
get_property(with_pages GLOBAL PROPERTY ZT_TOOLS_WITH_PAGES)
foreach(tool IN LISTS tools)
  if(NOT tool IN_LIST with_pages)
    message(FATAL_ERROR "${tool} has no man page: see tools/pages/README.md")
  endif()
endforeach()
if(tools)
  zt_find_library_from(${CMAKE_INSTALL_BINDIR} ${tools})
  install(TARGETS ${tools}
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT tools)
endif()

# doc
install(FILES LICENSE
  DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT runtime)
install(FILES README.md CHANGELOG.md CONTRIBUTING.md
  DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT doc)
install(DIRECTORY docs/ DESTINATION ${CMAKE_INSTALL_DOCDIR}/docs
  COMPONENT doc FILES_MATCHING PATTERN "*.md" PATTERN "*.png")
install(DIRECTORY examples DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT doc
  PATTERN CMakeLists.txt EXCLUDE)
install(DIRECTORY plugins DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT doc
  PATTERN CMakeLists.txt EXCLUDE)
install(DIRECTORY ${PROJECT_SOURCE_DIR}/build/docs/html
  DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT doc OPTIONAL)

# Only scripts/make-packages asks for packages.
option(ZT_BUILD_PACKAGES "Let cpack make Debian packages" OFF)
if(ZT_BUILD_PACKAGES)
  include(cmake/package.cmake)
endif()
