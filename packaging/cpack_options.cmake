# Read by CPack once per generator: the Debian package installs under the
# suite's directory, the archives hold the bare layout.
if(CPACK_GENERATOR STREQUAL "DEB")
  set(CPACK_PACKAGING_INSTALL_PREFIX /opt/tarnex)
else()
  set(CPACK_PACKAGING_INSTALL_PREFIX "")
endif()
