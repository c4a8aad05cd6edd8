# Run by CPack on its staging tree: gives the Debian package the
# /usr/bin/pocket-classifier link to the program under /opt/tarnex.
if(CPACK_GENERATOR STREQUAL "DEB")
  file(MAKE_DIRECTORY ${CPACK_TEMPORARY_DIRECTORY}/usr/bin)
  file(CREATE_LINK ${CPACK_PC_PACKAGE_LINK_TARGET} ${CPACK_TEMPORARY_DIRECTORY}/usr/bin/pocket-classifier SYMBOLIC)
endif()
