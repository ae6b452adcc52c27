# VEXLAN_SANITIZE=address  -> AddressSanitizer + UndefinedBehaviorSanitizer
# VEXLAN_SANITIZE=thread   -> ThreadSanitizer
set(VEXLAN_SANITIZE "" CACHE STRING "Sanitizer flavour: empty, address or thread")
if(VEXLAN_SANITIZE STREQUAL "address")
  set(_san -fsanitize=address,undefined -fno-sanitize-recover=undefined -fno-omit-frame-pointer)
elseif(VEXLAN_SANITIZE STREQUAL "thread")
  set(_san -fsanitize=thread -fno-omit-frame-pointer)
endif()
if(_san)
  add_compile_options(${_san})
  add_link_options(${_san})
endif()

# VEXLAN_FUZZ=ON (clang only, with VEXLAN_SANITIZE=address): every unit gets
# libFuzzer's coverage instrumentation, and tests/fuzz makes the fuzzers.
option(VEXLAN_FUZZ "Build the libFuzzer programs of tests/fuzz (clang)" OFF)
if(VEXLAN_FUZZ)
  if(NOT CMAKE_CXX_COMPILER_ID STREQUAL "Clang")
    message(FATAL_ERROR "VEXLAN_FUZZ needs clang (CMAKE_CXX_COMPILER=clang++)")
  endif()
  add_compile_options(-fsanitize=fuzzer-no-link)
endif()
