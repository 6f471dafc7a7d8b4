# End-to-end runs of the apply pipeline on the emulated machine.
pex_add_test(pipeline_apply_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/pipeline_fixture.cpp
          ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/apply_pipeline_test.cpp
  LIBS mendler_core)

