# End-to-end runs of the apply pipeline on the emulated machine.
find_package(ZLIB REQUIRED)
pex_add_test(pipeline_apply_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/pipeline_fixture.cpp
          ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/apply_pipeline_test.cpp
          ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/journal_recovery_test.cpp
          ${CMAKE_CURRENT_SOURCE_DIR}/rivzip/memory_streams.cpp
  LIBS mendler_core rivzip_codec ZLIB::ZLIB)
add_dependencies(pipeline_apply_test Rivzip)

