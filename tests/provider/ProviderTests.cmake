# CMake helpers of the test directories whose programs load the shipped
# provider (provider, fc, physical, nic). Included by each of them.
include_guard(GLOBAL)

# A test program that loads the shipped provider into the embedded CIM host:
# the given sources with the provider test helpers (provider_env), the paths
# of the build's provider library and class definitions, and both built first.
# Further libraries are added by the caller.
function(vexlan_provider_test_program target)
  add_executable(${target} ${ARGN} ${CMAKE_CURRENT_FUNCTION_LIST_DIR}/provider_env.cpp)
  target_include_directories(${target} PRIVATE ${CMAKE_CURRENT_FUNCTION_LIST_DIR})
  target_link_libraries(${target} PRIVATE cimhost_core zorap_cna_provider GTest::gtest GTest::gtest_main
                                          Threads::Threads)
  target_compile_definitions(${target} PRIVATE
    PROVIDER_LIBRARY="$<TARGET_FILE:Vexlan_CNA_Provider>"
    VEXLAN_MOF_DIR="${VEXLAN_SHARE_DIR}/mof"
    VEXLAN_FIXTURES="${PROJECT_SOURCE_DIR}/tests/fixtures")
  add_dependencies(${target} Vexlan_CNA_Provider vexlan_mof)
endfunction()

# A ctest test that runs a gtest program under tests/isolate.sh (private /opt
# and /var/tmp; exit 77, skipped, where that is not possible):
#   vexlan_isolated_gtest(<test name> <program target> [FILTER <gtest filter>]
#                         [TIMEOUT <seconds>] [LABELS <label>...])
function(vexlan_isolated_gtest name target)
  cmake_parse_arguments(ARG "" "FILTER;TIMEOUT" "LABELS" ${ARGN})
  get_filename_component(_isolate ${CMAKE_CURRENT_FUNCTION_LIST_DIR}/../isolate.sh ABSOLUTE)
  set(_command ${_isolate} $<TARGET_FILE:${target}>)
  if(ARG_FILTER)
    list(APPEND _command --gtest_filter=${ARG_FILTER})
  endif()
  add_test(NAME ${name} COMMAND ${_command})
  set_tests_properties(${name} PROPERTIES SKIP_RETURN_CODE 77)
  if(ARG_TIMEOUT)
    set_tests_properties(${name} PROPERTIES TIMEOUT ${ARG_TIMEOUT})
  endif()
  if(ARG_LABELS)
    set_tests_properties(${name} PROPERTIES LABELS "${ARG_LABELS}")
  endif()
endfunction()

# A table of such tests, one row each: "name|program|filter|timeout|labels"
# (labels may be empty), registered as <prefix>.<name>.
function(vexlan_isolated_gtest_table prefix)
  foreach(_row ${ARGN})
    string(REPLACE "|" ";" _f "${_row}")
    list(GET _f 0 _name)
    list(GET _f 1 _program)
    list(GET _f 2 _filter)
    list(GET _f 3 _timeout)
    list(GET _f 4 _labels)
    vexlan_isolated_gtest(${prefix}.${_name} ${_program} FILTER ${_filter} TIMEOUT ${_timeout} LABELS ${_labels})
  endforeach()
endfunction()
