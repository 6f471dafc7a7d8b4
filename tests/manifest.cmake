# Manifest processing.
pex_add_test(content_table_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/manifest/content_table_test.cpp
  LIBS pex_manifest)
