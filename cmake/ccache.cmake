# Uses ccache where it is present; the first build fills it, every later build
# of the same sources, in whatever folder, comes out of it.
find_program(ZT_CCACHE ccache)
if(ZT_CCACHE AND NOT CMAKE_CXX_COMPILER_LAUNCHER)
  set(CMAKE_C_COMPILER_LAUNCHER ${ZT_CCACHE})
  set(CMAKE_CXX_COMPILER_LAUNCHER ${ZT_CCACHE})
endif()
