# The machine's registry and the .reg files of `pexupdate reg`.
pex_add_test(registry_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/platform/registry_test.cpp
  LIBS pex_platform)
pex_add_test(reg_file_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/platform/reg_file_test.cpp
  LIBS pex_platform)

# `pexupdate reg`, run as a program.
if(TARGET pexupdate)
  pex_add_test(reg_command_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/tools/reg_command_test.cpp
    LIBS pex_platform)
  target_compile_definitions(reg_command_test PRIVATE PEXUPDATE_PATH="$<TARGET_FILE:pexupdate>")
  add_dependencies(reg_command_test pexupdate)
endif()
