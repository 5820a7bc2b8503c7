# SPDX-License-Identifier: MIT OR GPL-2.0-only
# The target without an operating system under it: what a kernel's build compiles and links, no library at all.
set(CMAKE_SYSTEM_NAME Generic)
set(CMAKE_SYSTEM_PROCESSOR arm)
set(CMAKE_C_COMPILER arm-none-eabi-gcc)
set(CMAKE_CXX_COMPILER arm-none-eabi-g++)
set(CMAKE_TRY_COMPILE_TARGET_TYPE STATIC_LIBRARY)   # there is nothing that a program could be linked with
