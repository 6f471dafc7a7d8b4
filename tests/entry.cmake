# The exported entry: the product loop, special files, schedule reset, progress record.
pex_add_test(entry_update_all_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/entry/update_all_test.cpp
  LIBS mendler_core)

# One run at a time in the process and on the machine; whole product runs, so the pipeline's
# fixture.
pex_add_test(entry_run_guard_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/entry/run_guard_test.cpp
          ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/pipeline_fixture.cpp
  LIBS mendler_core)
