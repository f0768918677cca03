# Tests: GoogleTest executables registered with CTest, one per directory of units so that the
# link count stays small.

if(TAVIK_BUILD_TESTS)
  enable_testing()
  include(GoogleTest)
endif()

# tavik_add_test(NAME <name> SOURCES <files...> [LIBRARIES <targets...>] [WHOLE_LIBRARY])
# WHOLE_LIBRARY links all of the static library, for tests that find schemas by name.
function(tavik_add_test)
  if(NOT TAVIK_BUILD_TESTS)
    return()
  endif()
  cmake_parse_arguments(ARG "WHOLE_LIBRARY" "NAME" "SOURCES;LIBRARIES" ${ARGN})
  add_executable(${ARG_NAME} ${ARG_SOURCES})
  tavik_target_warnings(${ARG_NAME})
  target_link_libraries(${ARG_NAME} PRIVATE ${ARG_LIBRARIES} tavik_base_testing
                        GTest::gmock GTest::gtest_main)
  if(ARG_WHOLE_LIBRARY)
    tavik_link_whole_library(${ARG_NAME})
  endif()
  # Names read "<executable>.<suite>.<test>", so that a run can pick one executable's tests.
  gtest_discover_tests(${ARG_NAME} DISCOVERY_MODE PRE_TEST TEST_PREFIX "${ARG_NAME}."
                       PROPERTIES ENVIRONMENT "TAVIK_SOURCE_DIR=${PROJECT_SOURCE_DIR}")
endfunction()
