// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A copy of a process that ends with _exit, as copies do, has counted as well: the linker puts this in its place. */
#include <stdnoreturn.h>

int __llvm_profile_write_file(void);
noreturn void __real__exit(int code);
noreturn void __wrap__exit(int code);

noreturn void __wrap__exit(int code)
{
    (void)__llvm_profile_write_file();
    __real__exit(code);
}
