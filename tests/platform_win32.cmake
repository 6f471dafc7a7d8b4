# Tests written for the Windows build. A module's application object is started and stopped by
# loading and freeing the module (the C run-time's DllMain on Windows; constructors on Linux,
# where the test runs too).
pex_test_module(PexAppModule ${CMAKE_CURRENT_SOURCE_DIR}/modules/app_module.cpp)
target_link_libraries(PexAppModule PRIVATE pex_platform)
pex_add_test(platform_module_hooks_test SOURCES platform/module_hooks_test.cpp)
add_dependencies(platform_module_hooks_test PexAppModule)

# Windows only: the window messages that the responsive wait pumps.
if(WIN32)
  pex_add_test(platform_message_pump_test SOURCES platform/message_pump_test.cpp)
  add_dependencies(platform_message_pump_test pextestprog)
endif()
