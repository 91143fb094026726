# zt_add_test(NAME [SOURCES …] [LIBRARIES …] [PLUGINS …] [LABELS …]
#             [TIMEOUT seconds])
#
# One test executable a source unit, since handler stack, temporary strings and
# beat belong to the process. Links the static library, so that a test reaches
# what a room keeps to itself; `src` is on its include path for that. The
# default source is NAME.cpp.
#
# A test with PLUGINS, made by zt_add_test_plugin, finds the folder that they
# are in as ZT_TEST_PLUGINS, and shows them the library that is linked into it.
function(zt_add_test name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "TIMEOUT"
                        "SOURCES;LIBRARIES;LABELS;PLUGINS")
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
  if(arg_PLUGINS)
    set_target_properties(${name} PROPERTIES ENABLE_EXPORTS ON)
    list(TRANSFORM arg_PLUGINS PREPEND test_plugin_)
    add_dependencies(${name} ${arg_PLUGINS})
    list(GET arg_PLUGINS 0 first)
    target_compile_definitions(${name} PRIVATE
      ZT_TEST_PLUGINS="$<TARGET_FILE_DIR:${first}>")
  endif()
  add_test(NAME ${name} COMMAND ${name})
  set_tests_properties(${name} PROPERTIES
    TIMEOUT ${arg_TIMEOUT} LABELS "${arg_LABELS}")
endfunction()

# zt_add_test_plugin(NAME [OPTIONS …])
#
# A shared object NAME.so from NAME.cpp, for tests of the same folder to load.
# It is linked with nothing: what it uses of the library, the test program has.
# OPTIONS are further options of the compiler.
function(zt_add_test_plugin name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "OPTIONS")
  set(target test_plugin_${name})
  add_library(${target} MODULE ${name}.cpp)
  target_link_libraries(${target} PRIVATE zt_options)
  target_compile_options(${target} PRIVATE ${arg_OPTIONS})
  target_link_options(${target} PRIVATE ${ZT_SANITIZE_FLAGS})
  target_include_directories(${target} PRIVATE
    ${PROJECT_SOURCE_DIR}/include ${PROJECT_SOURCE_DIR}/tests)
  set_target_properties(${target} PROPERTIES
    PREFIX "" SUFFIX ".so" OUTPUT_NAME ${name})
endfunction()
