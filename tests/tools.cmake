# The host program's own commands, as a person runs them, are golden runs (tests/runs/pexupdate_*).
# The progress display's reading of the library's progress record.
pex_add_test(tools_progress_tracker_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/tools/progress_tracker_test.cpp ${PROJECT_SOURCE_DIR}/tools/progress_tracker.cpp
  LIBS mendler_core)

