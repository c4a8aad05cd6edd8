# Shell tests of the installation, the packages, the man pages and the
# README's usage examples. They share the build tree's install and CPack
# state, so they never run at the same time.
set(pc_packaging_dir ${CMAKE_CURRENT_LIST_DIR})
foreach(name install_run deb_package man_pages readme_examples)
  add_test(NAME packaging.${name}
           COMMAND bash ${pc_packaging_dir}/${name}.sh ${PROJECT_BINARY_DIR} ${PROJECT_SOURCE_DIR} ${PROJECT_VERSION})
  set_tests_properties(packaging.${name} PROPERTIES RESOURCE_LOCK pc_install_tree TIMEOUT 120)
endforeach()
