# SPDX-License-Identifier: MIT OR GPL-2.0-only
# PMX_ARM_EMULATOR: the command before an ARM Linux program on this machine; empty where it cannot be run.
set(PMX_ARM_EMULATOR "")
find_program(PMX_QEMU_ARM qemu-arm)
find_program(PMX_ARM_LINUX_GXX arm-linux-gnueabihf-g++)
if(PMX_QEMU_ARM AND PMX_ARM_LINUX_GXX)
    # The compiler knows where its libraries are: <sysroot>/lib/<loader>.
    execute_process(
        COMMAND ${PMX_ARM_LINUX_GXX} -print-file-name=ld-linux-armhf.so.3
        OUTPUT_VARIABLE loader OUTPUT_STRIP_TRAILING_WHITESPACE COMMAND_ERROR_IS_FATAL ANY)
    cmake_path(NORMAL_PATH loader)
    cmake_path(GET loader PARENT_PATH sysroot)
    cmake_path(GET sysroot PARENT_PATH sysroot)
    set(PMX_ARM_EMULATOR ${PMX_QEMU_ARM} -L ${sysroot})
endif()
