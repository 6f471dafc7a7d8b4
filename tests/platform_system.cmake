# The system area of the platform: processes, libraries, version information, install at
# restart, and the test modules and program they act on.

# Test modules: ELF shared objects under Windows names, beside the test programs in bin/.
# Only their declared entry points are exported, as from a Windows DLL.
function(pex_test_module target)
  add_library(${target} MODULE ${ARGN})
  set_target_properties(${target} PROPERTIES PREFIX "" SUFFIX ".dll" CXX_VISIBILITY_PRESET hidden)
  target_link_options(${target} PRIVATE -Wl,--exclude-libs,ALL)
  pex_warnings(${target})
endfunction()

set(PEX_SELF_REGISTER_SRC ${CMAKE_CURRENT_SOURCE_DIR}/modules/self_register_module.cpp)
pex_test_module(PexSelfReg ${PEX_SELF_REGISTER_SRC})
target_compile_definitions(PexSelfReg PRIVATE PEX_MODULE_NAME="PexSelfReg")
target_link_libraries(PexSelfReg PRIVATE pex_platform)
pex_stamp_version(PexSelfReg FILE_DESCRIPTION "Self-registering test module" STRINGS "OLESelfRegister=")

pex_test_module(PexNoSelfReg ${PEX_SELF_REGISTER_SRC})
target_compile_definitions(PexNoSelfReg PRIVATE PEX_MODULE_NAME="PexNoSelfReg")
target_link_libraries(PexNoSelfReg PRIVATE pex_platform)
pex_stamp_version(PexNoSelfReg FILE_DESCRIPTION "Test module without self-registration")

pex_test_module(PexNoVersion ${CMAKE_CURRENT_SOURCE_DIR}/modules/plain_module.cpp)

add_executable(pextestprog ${CMAKE_CURRENT_SOURCE_DIR}/modules/pextestprog.cpp)
pex_warnings(pextestprog)

pex_add_test(platform_process_test SOURCES platform/process_test.cpp)
add_dependencies(platform_process_test pextestprog)

pex_add_test(platform_library_test SOURCES platform/library_test.cpp)
add_dependencies(platform_library_test PexSelfReg PexNoSelfReg PexNoVersion)

pex_add_test(platform_version_info_test SOURCES platform/version_info_test.cpp)
add_dependencies(platform_version_info_test PexSelfReg PexNoSelfReg PexNoVersion pexupdate)
target_compile_definitions(platform_version_info_test PRIVATE
  PEX_FIXTURE_DIR="${CMAKE_CURRENT_SOURCE_DIR}/fixtures"
  PEX_VERSION_MAJOR=${PEX_VERSION_MAJOR}u PEX_VERSION_MINOR=${PEX_VERSION_MINOR}u
  PEX_VERSION_BUILD=${PEX_VERSION_BUILD}u PEX_VERSION_REVISION=${PEX_VERSION_REVISION}u
  PEX_VERSION_TEXT="${PEX_VERSION_MAJOR}.${PEX_VERSION_MINOR}.${PEX_VERSION_BUILD}.${PEX_VERSION_REVISION}")

pex_add_test(platform_setup_install_test SOURCES platform/setup_install_test.cpp)
