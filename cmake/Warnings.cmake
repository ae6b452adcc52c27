# Warning flags applied to every target of the project.
add_compile_options(
  -Wall -Wextra -Wpedantic -Wshadow -Wformat=2 $<$<CXX_COMPILER_ID:GNU>:-Wformat-truncation=2>
  -Wno-unused-parameter
  $<$<COMPILE_LANGUAGE:CXX>:-Wnon-virtual-dtor>
  $<$<COMPILE_LANGUAGE:CXX>:-Woverloaded-virtual>
)
option(VEXLAN_WERROR "Treat warnings as errors" OFF)
if(VEXLAN_WERROR)
  add_compile_options(-Werror)
endif()
