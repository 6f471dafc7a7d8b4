# Manifest processing.
pex_add_test(content_table_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/manifest/content_table_test.cpp
  LIBS pex_manifest)
foreach(unit product_settings content_file download_type)
  pex_add_test(manifest_${unit}_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/manifest/${unit}_test.cpp
    LIBS mendler_core)
endforeach()
