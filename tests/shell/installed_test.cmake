# Installs the shell into a folder of its own and runs it from there.
#
#   cmake -DBUILD=folder -DBINDIR=bin -P installed_test.cmake

set(prefix ${BUILD}/installed_test)
file(REMOVE_RECURSE ${prefix})
execute_process(
  COMMAND ${CMAKE_COMMAND} -DCMAKE_INSTALL_PREFIX=${prefix}
          -P ${BUILD}/tools/ztsh/cmake_install.cmake
  OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
execute_process(
  COMMAND ${CMAKE_COMMAND} -E env --unset=LD_LIBRARY_PATH
          ${prefix}/${BINDIR}/ztsh -c "Echo installed"
  ERROR_VARIABLE errors COMMAND_ERROR_IS_FATAL ANY)
file(REMOVE_RECURSE ${prefix})
if(NOT errors STREQUAL "installed\n")
  message(FATAL_ERROR "it wrote: ${errors}")
endif()
