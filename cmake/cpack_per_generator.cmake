# Read by CPack for each generator: the .deb installs its folder under /opt; the archives hold the
# folder alone, to be unpacked anywhere.
if(CPACK_GENERATOR STREQUAL "DEB")
  set(CPACK_PACKAGING_INSTALL_PREFIX /opt/vantric/mendler)
else()
  set(CPACK_PACKAGING_INSTALL_PREFIX "")
endif()
