# SPDX-License-Identifier: MIT OR GPL-2.0-only
# What cmake --install puts in place: the layer's object and headers for a stack, the virtual board as a library, the
# tool with its boards and scenarios, the guides and the examples.
include(CMakePackageConfigHelpers)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/pmxConfigVersion.cmake COMPATIBILITY SameMajorVersion)
set(directories ${PMX_HEADER_DIRECTORIES})
list(TRANSFORM directories APPEND /)   # what is in them, not they themselves
install(DIRECTORY ${directories} DESTINATION include/pmx)
install(FILES ${PROJECT_BINARY_DIR}/pmx_if.o DESTINATION lib/pmx)
install(FILES ${PMX_VERSION_DIRECTORY}/pmx_version.h DESTINATION include/pmx)
# The flight recorder: around that object, and as sources for another compiler.
install(FILES ${PROJECT_BINARY_DIR}/pmx_if_recorded.o DESTINATION lib/pmx)
install(FILES recorder/pmx_recorder.h DESTINATION include/pmx)
install(FILES recorder/ring.h recorder/encoding.h ${PROJECT_BINARY_DIR}/recorder/shim.c DESTINATION share/pmx/recorder)
# A board without pictures takes none of their libraries, and has none of their headers.
if(TARGET pmx_picture)
    set(PMX_HAS_PICTURES TRUE)
    set(PMX_PICTURE_LIBRARIES "-lpixman-1 -lpng ")
    set(without_headers PATTERN picture_files.h EXCLUDE)   # they are the model's own
else()
    set(PMX_HAS_PICTURES FALSE)
    set(PMX_PICTURE_LIBRARIES "")
    set(without_headers PATTERN picture EXCLUDE)
endif()
configure_file(cmake/pmxConfig.cmake.in pmxConfig.cmake @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/pmxConfig.cmake ${PROJECT_BINARY_DIR}/pmxConfigVersion.cmake
    DESTINATION lib/cmake/pmx)
foreach(name pmx pmx-board)
    configure_file(cmake/${name}.pc.in ${name}.pc @ONLY)
    install(FILES ${PROJECT_BINARY_DIR}/${name}.pc DESTINATION lib/pkgconfig)
endforeach()
install(FILES ${PROJECT_BINARY_DIR}/board/board_functions.h DESTINATION include/pmx/board)
install(FILES ${PROJECT_BINARY_DIR}/board/recorded_calls.txt DESTINATION lib/pmx)
install(DIRECTORY board/ DESTINATION include/pmx/board FILES_MATCHING PATTERN "*.h" ${without_headers})
install(TARGETS pmx_board_whole pmxboard ARCHIVE DESTINATION lib/pmx RUNTIME DESTINATION bin)
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

# Last, the bill of materials, which lists what was put in place before it. Files are found under DESTDIR, when that is
# where they are put, and listed as they will lie.
set(libraries "")
foreach(library CLI11 nlohmann_json tomlplusplus)
    find_package(${library} QUIET)
    list(APPEND libraries "${library}=${${library}_VERSION}")
endforeach()
if(PMX_LINE_EDITOR AND LIBEDIT_LIBRARY)
    list(APPEND libraries libedit=)
endif()
if(TARGET pmx_picture)
    find_package(PNG QUIET)
    list(APPEND libraries pixman= libpng=${PNG_VERSION_STRING} libsixel=)
endif()
list(JOIN libraries " " libraries)
install(CODE "
    set(prefix \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}\")
    set(listed \"${PROJECT_BINARY_DIR}/installed.txt\")
    string(REPLACE \";\" \"\\n\$ENV{DESTDIR}\" files \"\$ENV{DESTDIR}\${CMAKE_INSTALL_MANIFEST_FILES}\")
    file(WRITE \${listed} \"\${files}\\n\")
    set(bill share/pmx/pmx.spdx.json)
    execute_process(
        COMMAND \"${Python3_EXECUTABLE}\" \"${PROJECT_SOURCE_DIR}/cmake/bill_of_materials.py\" \${prefix}
            ${PROJECT_VERSION} ${PMX_VERSION_DATE} \${prefix}/\${bill} ${libraries}
        INPUT_FILE \${listed}
        COMMAND_ERROR_IS_FATAL ANY)
    list(APPEND CMAKE_INSTALL_MANIFEST_FILES \${CMAKE_INSTALL_PREFIX}/\${bill})
    message(STATUS \"Written: \${prefix}/\${bill}\")")
