# SPDX-License-Identifier: MIT OR GPL-2.0-only
# How the layer is compiled, in every preset alike: what ships is what was tested. Nothing of the build type enters.

# The language that the product allows itself on every target, and what keeps the objects free of symbols and sections
# that a stack does not provide for. In a file of its own, which is installed: a port hands it to its compiler as it is.
set(layer_flags ${CMAKE_CURRENT_LIST_DIR}/../examples/layer.flags)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${layer_flags})
file(STRINGS ${layer_flags} PMX_PRODUCT_LANGUAGE)

# No names of the folders in which the objects were made.
set(PMX_PRODUCT_CODE
    -ffile-prefix-map=${PROJECT_SOURCE_DIR}/= -ffile-prefix-map=${PROJECT_BINARY_DIR}=build -g)

# The 32-bit target. The headers hold the width of enumerations, whatever a compiler thinks, and the layer has no
# wchar_t; an object's attributes name a width for both all the same, and a linker warns of any but a kernel's.
set(PMX_TARGET_ARM -march=armv7-a -mfloat-abi=soft -fno-short-enums -fshort-wchar)

# The forms in which it is built, and their flags: both instruction sets for size and for speed, and one for kernels,
# whose backtraces walk by tables. It is in ARM state, as kernels are that do not ask for Thumb-2.
set(PMX_TARGET_ARM_FORMS thumb-Os thumb-O2 arm-Os arm-O2 kernel)
set(PMX_TARGET_ARM_FORM_thumb-Os -mthumb -Os)
set(PMX_TARGET_ARM_FORM_thumb-O2 -mthumb -O2)
set(PMX_TARGET_ARM_FORM_arm-Os -marm -Os)
set(PMX_TARGET_ARM_FORM_arm-O2 -marm -O2)
set(PMX_TARGET_ARM_FORM_kernel -marm -Os -funwind-tables)

# What the target of this build asks for. A PC that runs ARM programs passes floating-point numbers in registers; the
# layer has none, and must not touch those registers.
set(PMX_PRODUCT_TARGET "")
if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(x86_64|AMD64|i.86)$")
    set(PMX_PRODUCT_TARGET -fcf-protection=none)
elseif(CMAKE_SYSTEM_PROCESSOR STREQUAL arm)
    set(PMX_PRODUCT_TARGET -march=armv7-a+fp -mfloat-abi=hard -mgeneral-regs-only -mthumb)
endif()

set(PMX_PRODUCT_FLAGS ${PMX_PRODUCT_LANGUAGE} ${PMX_PRODUCT_CODE} -O2 ${PMX_PRODUCT_TARGET})

set(PMX_PRODUCT_WARNINGS_GNU
    -Werror -Wall -Wextra -Wpedantic
    -Wconversion -Wsign-conversion -Warith-conversion -Wshadow -Wundef -Wformat=2 -Wformat-signedness
    -Wcast-qual -Wcast-align=strict -Wpointer-arith -Wmissing-declarations -Wredundant-decls -Wvla -Walloca
    -Wduplicated-cond -Wduplicated-branches -Wlogical-op -Wdouble-promotion -Wnull-dereference -Wdate-time
    -Wunused-macros -Wunused-const-variable=2 -Wextra-semi -Wcomma-subscript -Wzero-as-null-pointer-constant
    -Wstack-usage=1024)

# Who has clang build everything, to fuzz or to count, is warned elsewhere: it does not know all of these.
if(NOT CMAKE_CXX_COMPILER_ID STREQUAL GNU)
    set(PMX_PRODUCT_WARNINGS_GNU "")
endif()

# Everything that clang knows, less what contradicts the house: C-style casts, the stack's names with a leading
# underscore, records with natural padding, and being C++20.
set(PMX_PRODUCT_WARNINGS_CLANG
    -Werror -Weverything
    -Wno-c++98-compat -Wno-c++98-compat-pedantic -Wno-c++20-compat -Wno-old-style-cast -Wno-padded
    -Wno-reserved-identifier -Wno-reserved-macro-identifier
    -fcomment-block-commands=context)   # the contracts' own command
