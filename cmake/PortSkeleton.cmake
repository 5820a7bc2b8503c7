# SPDX-License-Identifier: MIT OR GPL-2.0-only
# The skeleton that a port starts from is written from the headers, at every build that finds them changed.
set(PMX_PORT_SKELETON ${PROJECT_BINARY_DIR}/examples/port_skeleton.c)
pmx_files(headers ${PROJECT_SOURCE_DIR}/src/system/inc/*.h ${PROJECT_SOURCE_DIR}/src/driver/private_inc/*.h)
pmx_files(readers ${PROJECT_SOURCE_DIR}/cmake/*.py)
add_custom_command(
    OUTPUT ${PMX_PORT_SKELETON}
    COMMAND ${CMAKE_COMMAND} -E make_directory ${PROJECT_BINARY_DIR}/examples
    COMMAND Python3::Interpreter ${PROJECT_SOURCE_DIR}/examples/port_skeleton.py ${PMX_PORT_SKELETON}
    DEPENDS ${PROJECT_SOURCE_DIR}/examples/port_skeleton.py ${readers} ${headers}
    COMMENT "Writing the skeleton of a port"
    VERBATIM)
add_custom_target(pmx_port_skeleton ALL DEPENDS ${PMX_PORT_SKELETON})
