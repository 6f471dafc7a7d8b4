# Diagnostics. The shared test support captures the trace log, so it links the log too.
target_link_libraries(pex_test_support PUBLIC pex_diag)
pex_add_test(diag_trace_log_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/diag/trace_log_test.cpp
  LIBS pex_diag)
pex_add_test(diag_startup_snapshot_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/diag/startup_snapshot_test.cpp
  LIBS mendler_core)
