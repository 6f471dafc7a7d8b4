# The shared utilities over the platform.
pex_add_test(commands_platform_utilities_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/commands/platform_utilities_test.cpp
  LIBS mendler_core)
target_compile_definitions(commands_platform_utilities_test PRIVATE
  PEX_FIXTURE_DIR="${CMAKE_CURRENT_SOURCE_DIR}/fixtures")
add_dependencies(commands_platform_utilities_test pextestprog)
