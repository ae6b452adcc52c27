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
