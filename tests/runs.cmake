# Golden runs: one test per folder of tests/runs, so a new folder needs no change here. The
# driver has its own main (it is also the child that a run cut off runs in), so it links
# GoogleTest without gtest_main.
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
  # One ctest test per folder, from a glob that the build checks again each time, so a folder
  # added since the last build is a test after the next `cmake --build`.
  file(GLOB golden_folders LIST_DIRECTORIES true CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/runs/*)
  foreach(folder ${golden_folders})
    if(IS_DIRECTORY ${folder})
      get_filename_component(name ${folder} NAME)
      add_test(NAME golden.${name} COMMAND golden_run_test --gtest_filter=golden.${name})
      set_tests_properties(golden.${name} PROPERTIES TIMEOUT 300)
    endif()
  endforeach()
endif()
