# What cmake --install puts in place: the layer's object and headers for a stack, the virtual board as a library, the
# tool with its boards and scenarios, the guides and the examples.
include(CMakePackageConfigHelpers)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/pmxConfigVersion.cmake COMPATIBILITY SameMajorVersion)
set(directories ${PMX_HEADER_DIRECTORIES})
list(TRANSFORM directories APPEND /)   # what is in them, not they themselves
install(DIRECTORY ${directories} DESTINATION include/pmx)
install(FILES ${PROJECT_BINARY_DIR}/pmx_if.o DESTINATION lib/pmx)
install(FILES ${PMX_VERSION_DIRECTORY}/pmx_version.h DESTINATION include/pmx)
install(FILES cmake/pmxConfig.cmake ${PROJECT_BINARY_DIR}/pmxConfigVersion.cmake DESTINATION lib/cmake/pmx)
install(DIRECTORY board/ DESTINATION include/pmx/board FILES_MATCHING PATTERN "*.h")
install(TARGETS pmx_board pmxboard ARCHIVE DESTINATION lib/pmx RUNTIME DESTINATION bin)
install(DIRECTORY boards scenarios examples DESTINATION share/pmx
    PATTERN port_skeleton.py EXCLUDE PATTERN __pycache__ EXCLUDE)
install(FILES ${PMX_PORT_SKELETON} DESTINATION share/pmx/examples)
install(FILES src/driver/pmx/pmx_export.c DESTINATION share/pmx)
install(DIRECTORY docs/ DESTINATION share/doc/pmx PATTERN Doxyfile EXCLUDE PATTERN schemas EXCLUDE)
install(DIRECTORY docs/schemas DESTINATION share/pmx)
if(PMX_MAN_PAGE)
    install(FILES ${PMX_MAN_PAGE} DESTINATION share/man/man1)
endif()
install(FILES tools/pmxboard/pmxboard.bash DESTINATION share/bash-completion/completions RENAME pmxboard)
install(FILES LICENSE CHANGELOG.md SECURITY.md DESTINATION share/doc/pmx)
install(DIRECTORY LICENSES DESTINATION share/doc/pmx)
