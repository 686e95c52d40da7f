# SPDX-License-Identifier: MIT
# tavi_add_test(NAME name SOURCES ... LIBS ...): a GoogleTest program whose cases CTest runs one by one,
# in parallel. Link tavi_appliance_main for programs that touch system paths, GTest::gmock_main for others.
find_package(GTest REQUIRED)
include(GoogleTest)

# GoogleTest's header takes most of the time in which a test is compiled, so that is done once, with the options of the
# test programs: otherwise they could not use it.
file(CONFIGURE OUTPUT headers.cpp CONTENT "")
add_library(tavi_test_headers OBJECT ${CMAKE_CURRENT_BINARY_DIR}/headers.cpp)
function(tavi_compile_as_test)
  set_target_properties(${ARGN} PROPERTIES POSITION_INDEPENDENT_CODE OFF)
  foreach(target ${ARGN})
    target_compile_options(${target} PRIVATE -fPIE -pthread $<$<CONFIG:Debug>:-g1>) # lines are enough: 15 % faster
  endforeach()
endfunction()
tavi_compile_as_test(tavi_test_headers)
target_link_libraries(tavi_test_headers PRIVATE GTest::gmock)
target_precompile_headers(tavi_test_headers PRIVATE
  <gmock/gmock.h> <chrono> <filesystem> <fstream> <functional> <optional> <string> <thread> <vector>)

# For what test programs alone are linked with, too.
function(tavi_use_test_headers)
  tavi_compile_as_test(${ARGN})
  foreach(target ${ARGN})
    target_precompile_headers(${target} REUSE_FROM tavi_test_headers)
  endforeach()
endfunction()

# Lets the library's waits for silence on a serial line be short in this test program: see
# tests/support/short_waits.cpp.
function(tavi_shorten_waits test)
  target_link_options(${test} PRIVATE LINKER:--no-as-needed $<TARGET_FILE:tavi_short_waits>)
  add_dependencies(${test} tavi_short_waits)
endfunction()

function(tavi_add_test)
  cmake_parse_arguments(TEST "" "NAME" "SOURCES;LIBS" ${ARGN})
  add_executable(${TEST_NAME} ${TEST_SOURCES})
  target_include_directories(${TEST_NAME} PRIVATE ${PROJECT_SOURCE_DIR})
  target_link_libraries(${TEST_NAME} PRIVATE ${TEST_LIBS})
  tavi_use_test_headers(${TEST_NAME})
  # The longest begin first, and then those that wait for a serial line, or the others would have nobody to run beside at
  # the end.
  if(tavi_public_calls IN_LIST TEST_LIBS)
    set(cost COST 20)
  elseif(tavi_modem_simulator IN_LIST TEST_LIBS)
    set(cost COST 10)
  endif()
  # An emulated program on a busy machine takes its time to list its cases.
  gtest_discover_tests(${TEST_NAME} TEST_PREFIX ${TEST_NAME}. DISCOVERY_TIMEOUT 60 PROPERTIES TIMEOUT 120 ${cost})
endfunction()
