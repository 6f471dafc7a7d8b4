# The release packages of this build (./run.sh package makes them from Release builds), unpacked
# into an empty folder and run there, with the C host program of docs/. `./run.sh windows` runs
# the same script over the Windows ZIP under Wine.
if(NOT WIN32)
  set(PEX_PACKAGE_TEST_DIR ${CMAKE_BINARY_DIR}/package-test)
  add_test(NAME package_runs_unpacked
    COMMAND bash -c "rm -rf \"$1\" && \"$2\" --config \"$3\" -B \"$1\" >/dev/null && bash \"$4\" \"$5\" \"$1\"/*.tar.gz \"$1\"/*.deb"
            package_test ${PEX_PACKAGE_TEST_DIR} ${CMAKE_CPACK_COMMAND} ${CMAKE_BINARY_DIR}/CPackConfig.cmake
            ${CMAKE_CURRENT_SOURCE_DIR}/package/unpacked_package_test.sh $<TARGET_FILE:host_example>)
  # Not in the sanitizer build: there Rivzip.dll takes CFile's type information from the program
  # that loaded the platform (the vptr check), which a host loading Mendler.dll privately, as the
  # C host does, does not share; the packages are made from plain builds anyway.
  set_tests_properties(package_runs_unpacked PROPERTIES LABELS "package;sanitize_skip" TIMEOUT 300)
endif()
