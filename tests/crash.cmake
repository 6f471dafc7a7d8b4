# Crash safety and error injection: whole product runs ended or failed at every operation.
# Each scenario starts from a copy of an emulated machine root, and the crash runs are forked
# children, so these tests exist for the Linux emulation only.
if(NOT WIN32)
  set(PEX_CRASH_SUPPORT
      ${CMAKE_CURRENT_SOURCE_DIR}/crash/crash_product.cpp
      ${CMAKE_CURRENT_SOURCE_DIR}/crash/machine_copies.cpp
      ${CMAKE_CURRENT_SOURCE_DIR}/pipeline/pipeline_fixture.cpp)
  set(PEX_CRASH_PRODUCT PEX_CRASH_PRODUCT="${CMAKE_CURRENT_SOURCE_DIR}/crash/product")

  pex_add_test(crash_sweep_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/crash/crash_sweep_test.cpp
            ${CMAKE_CURRENT_SOURCE_DIR}/crash/child_run.cpp ${PEX_CRASH_SUPPORT}
    LIBS mendler_core)
  target_compile_definitions(crash_sweep_test PRIVATE ${PEX_CRASH_PRODUCT})
  add_dependencies(crash_sweep_test Rivzip pextestprog)

  pex_add_test(power_cut_rules_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/crash/power_cut_rules_test.cpp
            ${CMAKE_CURRENT_SOURCE_DIR}/crash/child_run.cpp
    LIBS mendler_core)

  pex_add_test(crash_error_injection_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/crash/error_injection_test.cpp ${PEX_CRASH_SUPPORT}
    LIBS mendler_core)
  target_compile_definitions(crash_error_injection_test PRIVATE ${PEX_CRASH_PRODUCT})
  add_dependencies(crash_error_injection_test Rivzip pextestprog)
endif()
