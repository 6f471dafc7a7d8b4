# The exported entry: the product loop, special files, schedule reset, progress record.
pex_add_test(entry_update_all_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/entry/update_all_test.cpp
  LIBS mendler_core)
