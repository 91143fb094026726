# zt_add_test(NAME [SOURCES …] [LIBRARIES …] [LABELS …] [TIMEOUT seconds])
#
# One test executable a source unit, since handler stack, temporary strings and
# beat belong to the process. Links the static library, so that a test reaches
# what a room keeps to itself; `src` is on its include path for that. The
# default source is NAME.cpp.
function(zt_add_test name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "TIMEOUT"
                        "SOURCES;LIBRARIES;LABELS")
  if(NOT arg_SOURCES)
    set(arg_SOURCES ${name}.cpp)
  endif()
  if(NOT arg_TIMEOUT)
    set(arg_TIMEOUT 120)
  endif()
  add_executable(${name} ${arg_SOURCES})
  target_link_libraries(${name} PRIVATE
    zt_options zt_util2_static zt_test_support ${arg_LIBRARIES} gtest_main)
  target_include_directories(${name} PRIVATE
    ${PROJECT_SOURCE_DIR}/src ${PROJECT_SOURCE_DIR}/tests)
  add_test(NAME ${name} COMMAND ${name})
  set_tests_properties(${name} PROPERTIES
    TIMEOUT ${arg_TIMEOUT} LABELS "${arg_LABELS}")
endfunction()
