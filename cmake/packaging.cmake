# The release packages, made by CPack from the project version: the modules, pexupdate, the README
# and SHA256SUMS side by side in one folder. Windows: a ZIP. Linux: a .tar.gz and a .deb, with the
# platform library beside the modules and RPATH $ORIGIN, so the unpacked folder runs as it is.
set(PEX_PACKAGE_TARGETS Mendler Rivzip pexupdate)
if(WIN32)
  # Statically linked: nothing but Windows' own DLLs is needed beside them (and no import library
  # belongs in a release).
  foreach(target ${PEX_PACKAGE_TARGETS})
    install(PROGRAMS $<TARGET_FILE:${target}> DESTINATION .)
  endforeach()
  set(CPACK_GENERATOR ZIP)
  set(CPACK_SYSTEM_NAME win64)
else()
  list(APPEND PEX_PACKAGE_TARGETS pexplatform)
  set_target_properties(${PEX_PACKAGE_TARGETS} PROPERTIES INSTALL_RPATH "$ORIGIN")
  install(TARGETS ${PEX_PACKAGE_TARGETS} RUNTIME DESTINATION . LIBRARY DESTINATION .)
  set(CPACK_GENERATOR TGZ DEB)
  set(CPACK_SYSTEM_NAME linux-x86_64)
endif()
install(FILES ${CMAKE_SOURCE_DIR}/README.md DESTINATION .)

# SHA256SUMS in the form `sha256sum -c` reads, of every file installed before it.
install(CODE [[
  set(folder "$ENV{DESTDIR}${CMAKE_INSTALL_PREFIX}")
  file(GLOB names RELATIVE "${folder}" "${folder}/*")
  list(REMOVE_ITEM names SHA256SUMS)
  list(SORT names)
  set(sums "")
  foreach(name ${names})
    if(NOT IS_DIRECTORY "${folder}/${name}")
      file(SHA256 "${folder}/${name}" sum)
      string(APPEND sums "${sum}  ${name}\n")
    endif()
  endforeach()
  file(WRITE "${folder}/SHA256SUMS" "${sums}")
]])

# Packages are made after the build (./run.sh package, the package tests): packing does not
# build everything again first.
set(CMAKE_SKIP_INSTALL_ALL_DEPENDENCY ON)
set(CPACK_PACKAGE_NAME Mendler)
set(CPACK_PACKAGE_VENDOR Vantric)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "Vantric Software Update: the update-applying library and its host")
set(CPACK_PACKAGE_FILE_NAME "Mendler-${PROJECT_VERSION}-${CPACK_SYSTEM_NAME}")
set(CPACK_PACKAGE_CONTACT "Vantric <support@vantric.example>")
set(CPACK_PROJECT_CONFIG_FILE ${CMAKE_CURRENT_LIST_DIR}/cpack_per_generator.cmake)
# The .deb's Depends come from the libraries the binaries need, found by dpkg-shlibdeps (our
# platform library is the package's own).
set(CPACK_DEBIAN_PACKAGE_NAME mendler)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION utils)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${CMAKE_BINARY_DIR}/bin)
include(CPack)
