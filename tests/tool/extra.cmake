# Small executables for the version reader: one with version 0.0.0.0, one with
# 3.2.7.9 and one without any version section. The test suite itself carries
# 7.5.0.1 so that the running program's own version can be checked too.
set(fixture_source ${CMAKE_CURRENT_LIST_DIR}/version_fixture_main.cpp)
add_executable(pc_version_fixture_zero ${fixture_source})
pc_attach_version(pc_version_fixture_zero VERSION 0.0.0.0)
add_executable(pc_version_fixture_3_2 ${fixture_source})
pc_attach_version(pc_version_fixture_3_2 VERSION 3.2.7.9 DESCRIPTION "Fixture \"three\\two\"")
add_executable(pc_version_fixture_none ${fixture_source})
pc_attach_version(test_tool VERSION 7.5.0.1)

add_dependencies(test_tool pc_version_fixture_zero pc_version_fixture_3_2 pc_version_fixture_none)
target_compile_definitions(test_tool PRIVATE
  PC_VERSION_FIXTURE_ZERO="$<TARGET_FILE:pc_version_fixture_zero>"
  PC_VERSION_FIXTURE_3_2="$<TARGET_FILE:pc_version_fixture_3_2>"
  PC_VERSION_FIXTURE_NONE="$<TARGET_FILE:pc_version_fixture_none>")
