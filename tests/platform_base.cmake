# Tests of the platform base: path rules and mapping, files and folders, the fault plan.
foreach(unit paths files fault)
  pex_add_test(platform_${unit}_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/platform/${unit}_test.cpp
    LIBS pex_platform)
endforeach()
