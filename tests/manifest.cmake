# Manifest processing.
pex_add_test(content_table_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/manifest/content_table_test.cpp
  LIBS pex_manifest)
pex_add_test(manifest_parser_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/manifest/manifest_parser_test.cpp
  LIBS mendler_core)
# Loads of hostile sizes, each in a child process under an address-space limit (fork, setrlimit).
if(NOT WIN32)
  pex_add_test(content_table_limits_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/manifest/content_table_limits_test.cpp
    LIBS pex_manifest)
endif()
