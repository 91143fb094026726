# Installs the shell into a folder of its own and runs it from there.
#
#   cmake -DBUILD=folder -DBINDIR=bin -P installed_test.cmake

set(prefix ${BUILD}/installed_test)
file(REMOVE_RECURSE ${prefix})
foreach(component runtime tools)
  execute_process(
    COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${prefix}
            --component ${component}
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
endforeach()
execute_process(
  COMMAND ${CMAKE_COMMAND} -E env --unset=LD_LIBRARY_PATH
          ${prefix}/${BINDIR}/ztsh -c "Echo installed"
  ERROR_VARIABLE errors COMMAND_ERROR_IS_FATAL ANY)
file(REMOVE_RECURSE ${prefix})
if(NOT errors STREQUAL "installed\n")
  message(FATAL_ERROR "it wrote: ${errors}")
endif()
