# What every source of the project is compiled with: `zt_options`.
#
# Results are bit-exact on every machine, so multiplications and additions are
# never contracted and no fast-math flag is ever allowed in here.
#
# Nobody puts functions of their own in the place of the library's, so that it
# may call, and inline, its own directly.

# The CMake language splits on semicolons, the cache variable on commas.
string(REPLACE "," ";" zt_sanitizers "${ZT_SANITIZE}")
set(ZT_SANITIZE_FLAGS "")
foreach(sanitizer IN LISTS zt_sanitizers)
  list(APPEND ZT_SANITIZE_FLAGS -fsanitize=${sanitizer})
endforeach()
if(ZT_SANITIZE_FLAGS)
  list(APPEND ZT_SANITIZE_FLAGS -fno-sanitize-recover=all
       -fno-omit-frame-pointer)
endif()

add_library(zt_options INTERFACE)
target_compile_options(zt_options INTERFACE
  -ffp-contract=off
  -fvisibility=hidden -fvisibility-inlines-hidden
  -fno-semantic-interposition
  -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wformat=2
  ${ZT_SANITIZE_FLAGS})
if(ZT_WARNINGS_AS_ERRORS)
  target_compile_options(zt_options INTERFACE -Werror)
endif()
