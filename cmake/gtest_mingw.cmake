# GoogleTest for the Windows build. Debian's libgtest-dev holds Linux libraries only, so the
# cross-build compiles GoogleTest from the sources of Debian's googletest package with the same
# toolchain. Provides GTest::gtest and GTest::gtest_main, as find_package(GTest) does natively.
#
# pex_wine_test(target): records a test program for `./run.sh windows`, which runs every
# recorded program under Wine. The list is written to <build>/wine-tests.txt, one Windows
# program path per line.
set(PEX_GOOGLETEST_SOURCE /usr/src/googletest CACHE PATH "GoogleTest sources for cross-builds")
if(NOT EXISTS ${PEX_GOOGLETEST_SOURCE}/googletest/CMakeLists.txt)
  message(FATAL_ERROR "GoogleTest sources not found in ${PEX_GOOGLETEST_SOURCE}: install googletest")
endif()

set(BUILD_GMOCK OFF CACHE BOOL "" FORCE)
set(INSTALL_GTEST OFF CACHE BOOL "" FORCE)
set(gtest_force_shared_crt OFF CACHE BOOL "" FORCE)
add_subdirectory(${PEX_GOOGLETEST_SOURCE}/googletest ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
# GoogleTest's own warnings are not ours to fix.
foreach(t gtest gtest_main)
  target_compile_options(${t} PRIVATE -w)
endforeach()

set_property(GLOBAL PROPERTY PEX_WINE_TESTS "")
function(pex_wine_test target)
  set_property(GLOBAL APPEND PROPERTY PEX_WINE_TESTS "$<TARGET_FILE:${target}>")
  set_property(GLOBAL APPEND PROPERTY PEX_WINE_TEST_TARGETS ${target})
  add_test(NAME ${target} COMMAND ${target})
endfunction()

function(pex_write_wine_test_list)
  get_property(programs GLOBAL PROPERTY PEX_WINE_TESTS)
  list(JOIN programs "\n" lines)
  file(GENERATE OUTPUT ${CMAKE_BINARY_DIR}/wine-tests.txt CONTENT "${lines}\n")
endfunction()
cmake_language(DEFER DIRECTORY ${CMAKE_SOURCE_DIR} CALL pex_write_wine_test_list)

# The test programs run under Wine, which shows the build machine's files on drive Z:. Paths
# of the build machine that the tests have compiled in (fixtures, built modules) are given in
# that form, so they name the same file whatever the current drive of the test.
function(pex_wine_paths_on_z)
  get_property(programs GLOBAL PROPERTY PEX_WINE_TEST_TARGETS)
  foreach(target ${programs})
    get_target_property(defs ${target} COMPILE_DEFINITIONS)
    if(NOT defs)
      continue()
    endif()
    set(mapped)
    foreach(def ${defs})
      string(REGEX REPLACE "^([A-Za-z0-9_]+)=\"(/|\\$<TARGET_FILE)" "\\1=\"Z:\\2" def "${def}")
      list(APPEND mapped "${def}")
    endforeach()
    set_target_properties(${target} PROPERTIES COMPILE_DEFINITIONS "${mapped}")
  endforeach()
endfunction()
cmake_language(DEFER DIRECTORY ${CMAKE_SOURCE_DIR} CALL pex_wine_paths_on_z)
