# The Debian packages, one for each component of the installation. Made by
# scripts/make-packages, which sets the folders that Debian wants.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_CONTACT "the libzt_util2 maintainers <zt-util2@localhost>")
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_COMPONENTS_ALL runtime dev tools doc)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR})
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY ">=")

function(zt_package component name section description)
  string(TOUPPER ${component} upper)
  set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${name} PARENT_SCOPE)
  set(CPACK_DEBIAN_${upper}_PACKAGE_SECTION ${section} PARENT_SCOPE)
  set(CPACK_COMPONENT_${upper}_DESCRIPTION "${description}" PARENT_SCOPE)
  install(FILES LICENSE RENAME copyright COMPONENT ${component}
    DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/doc/${name})
endfunction()

set(runtime libzt-util2-${PROJECT_VERSION_MAJOR})
set(this_version "(= ${PROJECT_VERSION})")
zt_package(runtime ${runtime} libs
  "The shared library and the plug-ins that come with it.")
zt_package(dev libzt-util2-dev libdevel
  "What hosts and plug-ins are built with: headers, the static library, files \
for CMake and pkg-config.")
zt_package(tools zt-util2-tools utils
  "The programs, above all ztsh, which runs scripts of the command language.")
zt_package(doc libzt-util2-doc doc
  "The guides, the reference and the examples.")

# Opened when a sound is first read or played, so that no program that makes no
# sound needs them; the linker knows nothing of it.
set(CPACK_DEBIAN_RUNTIME_PACKAGE_DEPENDS "libsndfile1")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_RECOMMENDS "libportaudio2")
set(CPACK_DEBIAN_DEV_PACKAGE_DEPENDS "${runtime} ${this_version}")
set(CPACK_DEBIAN_TOOLS_PACKAGE_DEPENDS "${runtime} ${this_version}")
set(CPACK_DEBIAN_DOC_PACKAGE_ARCHITECTURE all)
set(CPACK_DEBIAN_DOC_PACKAGE_SHLIBDEPS OFF)
include(CPack)
