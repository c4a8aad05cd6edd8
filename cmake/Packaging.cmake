# Installation in the suite's layout and the packages made from it:
#   exe/linux/ (exe/msw/ on Windows)  the programs; the classifier finds its
#                                     installation two directories above itself
#   config/environ.cfg                the installation's configuration layer
#   share/man/, share/doc/pocket-classifier/
if(WIN32)
  set(PC_INSTALL_EXE_DIR exe/msw)
else()
  set(PC_INSTALL_EXE_DIR exe/linux)
endif()
set(PC_INSTALL_DOC_DIR share/doc/pocket-classifier)

set(pc_installed_programs pocket-classifier gen_contours)
if(TARGET pocket-inspect)
  list(APPEND pc_installed_programs pocket-inspect)
endif()
install(TARGETS ${pc_installed_programs} RUNTIME DESTINATION ${PC_INSTALL_EXE_DIR})
install(FILES ${PROJECT_SOURCE_DIR}/packaging/environ.cfg DESTINATION config)
install(FILES ${PROJECT_SOURCE_DIR}/README.md ${PROJECT_SOURCE_DIR}/LICENSE DESTINATION ${PC_INSTALL_DOC_DIR})
install(DIRECTORY ${PROJECT_SOURCE_DIR}/examples/zone DESTINATION ${PC_INSTALL_DOC_DIR}/examples)
install(FILES ${PROJECT_SOURCE_DIR}/doc/pocket-classifier.1 DESTINATION share/man/man1)
install(FILES ${PROJECT_SOURCE_DIR}/doc/environ.cfg.5 DESTINATION share/man/man5)
if(EXISTS ${PROJECT_SOURCE_DIR}/tools/inspect/pocket-inspect.1)
  install(FILES ${PROJECT_SOURCE_DIR}/tools/inspect/pocket-inspect.1 DESTINATION share/man/man1)
endif()

set(CPACK_PACKAGE_NAME pocket-classifier)
set(CPACK_PACKAGE_VENDOR "tarnex")
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "Z-level pocket classifier of the tarnex CAM suite")
set(CPACK_PACKAGE_CONTACT "pocket-classifier developers <pocket-classifier@localhost>")
set(CPACK_RESOURCE_FILE_LICENSE ${PROJECT_SOURCE_DIR}/LICENSE)
set(CPACK_PACKAGE_FILE_NAME "pocket-classifier-${PROJECT_VERSION}-${CMAKE_SYSTEM_NAME}")
if(WIN32)
  set(CPACK_GENERATOR ZIP)
else()
  set(CPACK_GENERATOR DEB TGZ)
endif()
# The archives hold the layout itself; the package puts it under the suite's
# directory and links the classifier into the PATH.
set(CPACK_INCLUDE_TOPLEVEL_DIRECTORY OFF)
set(CPACK_PROJECT_CONFIG_FILE ${PROJECT_SOURCE_DIR}/packaging/cpack_options.cmake)
set(CPACK_DEBIAN_PACKAGE_SECTION misc)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS OFF)
set(CPACK_DEBIAN_PACKAGE_DEPENDS "libc6, libstdc++6")
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
# gzip keeps making the package a matter of seconds.
set(CPACK_DEBIAN_COMPRESSION_TYPE gzip)
# The /usr/bin link belongs to the package only: an install into any other
# prefix must not reach outside it.
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/packaging/package_link.cmake)
set(PC_PACKAGE_LINK_TARGET /opt/tarnex/${PC_INSTALL_EXE_DIR}/pocket-classifier)
set(CPACK_PC_PACKAGE_LINK_TARGET ${PC_PACKAGE_LINK_TARGET})
include(CPack)
