# The machine's registry and the .reg files of `pexupdate reg` (the command itself is the golden
# run pexupdate_reg).
pex_add_test(registry_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/platform/registry_test.cpp
  LIBS pex_platform)
pex_add_test(reg_file_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/platform/reg_file_test.cpp
  LIBS pex_platform)
