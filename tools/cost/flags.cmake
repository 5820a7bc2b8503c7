# SPDX-License-Identifier: MIT OR GPL-2.0-only
# Prints the product's flags, one list a line: cmake -DROOT=... -P flags.cmake
set(PROJECT_SOURCE_DIR ${ROOT})
set(PROJECT_BINARY_DIR ${ROOT}/build)
cmake_host_system_information(RESULT CMAKE_SYSTEM_PROCESSOR QUERY OS_PLATFORM)
include(${ROOT}/cmake/ProductFlags.cmake)
foreach(name PMX_PRODUCT_LANGUAGE PMX_PRODUCT_CODE PMX_PRODUCT_FLAGS PMX_TARGET_ARM PMX_TARGET_ARM_FORM_kernel)
    string(JOIN " " joined ${${name}})
    execute_process(COMMAND ${CMAKE_COMMAND} -E echo "${name} ${joined}")
endforeach()
