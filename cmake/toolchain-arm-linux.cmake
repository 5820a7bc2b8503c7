# SPDX-License-Identifier: MIT OR GPL-2.0-only
# The 32-bit target as a PC runs it: ARM Linux programs under qemu-arm. Only the processor is the product's.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR arm)
set(CMAKE_C_COMPILER arm-linux-gnueabihf-gcc)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)

include(${CMAKE_CURRENT_LIST_DIR}/ArmEmulator.cmake)
set(CMAKE_CROSSCOMPILING_EMULATOR ${PMX_ARM_EMULATOR})

# The libraries that board, tools and tests use: what Debian has for the host is of use only where it is headers or
# sources. The modules of this directory find it.
list(PREPEND CMAKE_MODULE_PATH ${CMAKE_CURRENT_LIST_DIR}/arm-linux)
set(CMAKE_FIND_ROOT_PATH ${sysroot})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
