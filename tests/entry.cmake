# One run at a time in the process and on the machine; whole product runs, so the pipeline's
# fixture.
pex_add_test(entry_run_guard_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/entry/run_guard_test.cpp
          ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/pipeline_fixture.cpp
  LIBS mendler_core)
