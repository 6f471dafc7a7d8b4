# Golden runs: one test per folder of tests/runs, found when the tests are listed, so a new
# folder needs no change here. The driver has its own main (it is also the child that a run
# cut off runs in), so it links GoogleTest without gtest_main.
add_executable(golden_run_test ${CMAKE_CURRENT_SOURCE_DIR}/runs/golden_run_test.cpp
                               ${CMAKE_CURRENT_SOURCE_DIR}/runs/golden_child.cpp)
target_link_libraries(golden_run_test PRIVATE mendler_core pex_test_support GTest::gtest)
target_compile_definitions(golden_run_test PRIVATE PEX_RUNS_DIR="${CMAKE_CURRENT_SOURCE_DIR}/runs"
                                                  PEXUPDATE_PATH="$<TARGET_FILE:pexupdate>")
pex_warnings(golden_run_test)
add_dependencies(golden_run_test pexupdate Mendler Rivzip pextestprog PexSelfReg PexNoSelfReg PexNoVersion)
if(COMMAND pex_wine_test)
  pex_wine_test(golden_run_test)
else()
  gtest_discover_tests(golden_run_test DISCOVERY_MODE PRE_TEST DISCOVERY_TIMEOUT 60 PROPERTIES TIMEOUT 300)
endif()
