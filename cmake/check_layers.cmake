# Fails when a source includes what its room may not see.
#
#   cmake -DROOT=<tree> -P cmake/check_layers.cmake
#
# Two rules. A room includes itself and the rooms that the table below lists.
# Headers of the operating system are included under src/platform/ only; a
# public header may show the few types listed as `shown_by_public_headers`.
cmake_minimum_required(VERSION 3.25)
get_filename_component(ROOT "${ROOT}" ABSOLUTE)

set(may_include_platform "")
set(may_include_core platform)
set(may_include_diag core platform)
set(may_include_command diag core platform)
set(may_include_env command diag core platform)
set(may_include_time command diag core platform)
set(may_include_geometry diag core platform)
set(may_include_sound time diag core platform)
set(may_include_image env diag core platform)
set(may_include_host platform core diag command env time geometry sound image)
set(rooms platform core diag command env time geometry sound image host)

# The room that each public header belongs to. ZT/signals is defined in diag,
# but stands as low as ZT/util, which shows it to hosts.
set(headers_core KVO/KvoCommon KVO/KvoObject KVO/KvoArray KVO/KvoObjArr
    KVO/KvoList KVO/KvoObjList KVO/KvoSkipList ZT/common ZT/util ZT/skip
    ZT/object ZT/array ZT/objarr ZT/list ZT/objlist ZT/keylist ZT/signals)
set(headers_diag ZT/error)
set(headers_command KVO/KvoToken KVO/KvoStatement ZT/token ZT/statement
    ZT/directive ZT/property)
set(headers_env ZT/filepath KVO/KvoPrefs ZT/plug)
set(headers_time KVO/KvoTime ZT/time ZT/swatch ZT/timer ZT/shuttle)
set(headers_geometry KVO/KvoVec ZT/math)
set(headers_sound KVO/KvoSound ZT/sound)
set(headers_image ZT/image_sgi)
set(headers_host ZT/dircom ZT/std_imp KVO/KvoRecognizer ZT/recognizer)

# Headers that are not the C++ language's own count as the system's.
set(system_headers "^(sys/.*|arpa/.*|net/.*|netinet/.*|linux/.*|bits/.*|\
unistd|fcntl|dlfcn|dirent|signal|poll|spawn|pthread|semaphore|sched|netdb|\
termios|pwd|grp|link|elf|glob|ftw|syslog|time|strings|sndfile|portaudio|png)\
[.]h$")
set(shown_by_public_headers sys/time.h)

set(faults "")
macro(fault file text)
  list(APPEND faults "${file}: ${text}")
endmacro()

function(room_of_public_header include out)
  string(REGEX REPLACE "[.]h$" "" stem "${include}")
  set(${out} "" PARENT_SCOPE)
  foreach(room IN LISTS rooms)
    if(stem IN_LIST headers_${room})
      set(${out} ${room} PARENT_SCOPE)
    endif()
  endforeach()
endfunction()

# The room an include leads to; empty for a standard or system header.
function(room_of_include include out)
  set(${out} "" PARENT_SCOPE)
  if(include MATCHES "^(KVO|ZT)/")
    room_of_public_header("${include}" room)
    if(room STREQUAL "")
      set(room unlisted)
    endif()
    set(${out} ${room} PARENT_SCOPE)
  elseif(include MATCHES "^([a-z]+)/" AND CMAKE_MATCH_1 IN_LIST rooms)
    set(${out} ${CMAKE_MATCH_1} PARENT_SCOPE)
  endif()
endfunction()

macro(check_include file room include)
  room_of_include("${include}" target)
  if(target STREQUAL "unlisted")
    fault(${file} "<${include}> is in no room's list of public headers")
  elseif(NOT target STREQUAL "" AND NOT target STREQUAL "${room}" AND
         NOT target IN_LIST may_include_${room})
    fault(${file} "${room} may not include ${include} (${target})")
  endif()
  if("${include}" MATCHES "${system_headers}" AND
     NOT "${room}" STREQUAL "platform")
    if(NOT ("${file}" MATCHES "^include/" AND
            "${include}" IN_LIST shown_by_public_headers))
      fault(${file} "<${include}> belongs under src/platform/")
    endif()
  endif()
endmacro()

macro(check_file file room)
  file(STRINGS "${ROOT}/${file}" lines REGEX "^[ \t]*#[ \t]*include")
  foreach(line IN LISTS lines)
    if(line MATCHES "include[ \t]*[<\"]([^>\"]+)[>\"]")
      check_include("${file}" "${room}" "${CMAKE_MATCH_1}")
    endif()
  endforeach()
  math(EXPR checked "${checked} + 1")
endmacro()

set(checked 0)
foreach(room IN LISTS rooms)
  file(GLOB_RECURSE files RELATIVE "${ROOT}" "${ROOT}/src/${room}/*.cpp"
       "${ROOT}/src/${room}/*.h")
  foreach(file IN LISTS files)
    check_file("${file}" ${room})
  endforeach()
endforeach()
file(GLOB_RECURSE files RELATIVE "${ROOT}" "${ROOT}/include/*.h")
foreach(file IN LISTS files)
  string(REGEX REPLACE "^include/" "" include "${file}")
  room_of_public_header("${include}" room)
  if(room STREQUAL "")
    fault(${file} "is in no room's list of public headers")
  else()
    check_file("${file}" ${room})
  endif()
endforeach()

if(faults)
  list(JOIN faults "\n  " text)
  message(FATAL_ERROR "layers:\n  ${text}")
endif()
if(checked EQUAL 0)
  message(FATAL_ERROR "layers: no source found below ${ROOT}")
endif()
message(STATUS "layers: ${checked} files, every include points down")
