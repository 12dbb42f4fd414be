# The shared library may only need C and maths functions that every target
# platform's C library offers, Android's bionic (API level 21) included. Any
# other undefined symbol fails: it would not link or load on the phones.
# C++ runtime symbols are allowed (the NDK's libc++ provides its own).
if(COVERAGE)
  message(STATUS "skipped in a coverage build")
  return()
endif()
include(${CMAKE_CURRENT_LIST_DIR}/nm_names.cmake)
nm_names(needed ${LIBRARY} --undefined-only)

set(allowed
  # C library
  malloc free memcpy memmove memset memcmp strlen fopen fclose fread fwrite fseek ftell lrand48 getenv
  abort __stack_chk_fail __stack_chk_guard __errno_location __assert_fail
  # Linux and Android only (the library asks for them there alone)
  madvise sysconf
  # maths library
  sqrt sqrtf pow powf exp expf log logf sin sinf cos cosf sincos sincosf atan2 atan2f floor ceil
  # loader and toolchain artifacts
  __cxa_finalize __gmon_start__ _ITM_registerTMCloneTable _ITM_deregisterTMCloneTable __dso_handle
  # pulled in by the GNU 32-bit ARM runtime library; the NDK brings its own runtime
  __getauxval)

set(unexpected)
foreach(name IN LISTS needed)
  # Sanitizer builds add calls into their runtimes; those builds never ship.
  if(name MATCHES "^(_Z|__cxa_|__gxx_personality|_Unwind_|__aeabi_|__gnu_|__sync_|__atomic_|__asan_|__ubsan_|__lsan_|__sanitizer_)")
    continue()
  endif()
  list(FIND allowed "${name}" at)
  if(at EQUAL -1)
    list(APPEND unexpected "${name}")
  endif()
endforeach()
if(unexpected)
  message(FATAL_ERROR "the library needs functions not known to every target C library: ${unexpected}")
endif()
message(STATUS "platform symbols: only portable C, maths and C++ runtime functions are needed")
