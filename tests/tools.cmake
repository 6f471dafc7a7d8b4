# The host program's own commands, run as a person runs them.
pex_add_test(tools_update_commands_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/tools/update_commands_test.cpp
  LIBS pex_platform)
target_compile_definitions(tools_update_commands_test PRIVATE PEXUPDATE_PATH="$<TARGET_FILE:pexupdate>")
add_dependencies(tools_update_commands_test pexupdate Mendler)

# The progress display's reading of the library's progress record.
pex_add_test(tools_progress_tracker_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/tools/progress_tracker_test.cpp ${PROJECT_SOURCE_DIR}/tools/progress_tracker.cpp
  LIBS mendler_core)

