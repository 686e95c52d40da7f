# tavi_add_test(NAME name SOURCES ... LIBS ...): a GoogleTest program whose cases CTest runs one by one,
# in parallel. Link tavi_appliance_main for programs that touch system paths, GTest::gmock_main for others.
find_package(GTest REQUIRED)
include(GoogleTest)

function(tavi_add_test)
  cmake_parse_arguments(TEST "" "NAME" "SOURCES;LIBS" ${ARGN})
  add_executable(${TEST_NAME} ${TEST_SOURCES})
  target_include_directories(${TEST_NAME} PRIVATE ${PROJECT_SOURCE_DIR})
  target_link_libraries(${TEST_NAME} PRIVATE ${TEST_LIBS})
  gtest_discover_tests(${TEST_NAME} TEST_PREFIX ${TEST_NAME}. PROPERTIES TIMEOUT 60)
endfunction()
