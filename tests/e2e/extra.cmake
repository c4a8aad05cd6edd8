# The version the installed program reports for --version.
target_compile_definitions(test_e2e PRIVATE PC_VERSION_TEXT="${PROJECT_VERSION}")
