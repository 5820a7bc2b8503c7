# SPDX-License-Identifier: MIT OR GPL-2.0-only
# GoogleTest for the target, from the sources that Debian has.
if(NOT EXISTS /usr/src/googletest/CMakeLists.txt)
    message(FATAL_ERROR "GTest: /usr/src/googletest is missing: ./dev setup installs it")
endif()
set(INSTALL_GTEST OFF)
add_subdirectory(/usr/src/googletest ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL SYSTEM)
set(GTest_FOUND TRUE)
