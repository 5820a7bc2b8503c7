# SPDX-License-Identifier: MIT OR GPL-2.0-only
# The headers through which the layer, the stack and the virtual board know each other.
set(PMX_HEADER_DIRECTORIES
    ${PROJECT_SOURCE_DIR}/src/system/inc
    ${PROJECT_SOURCE_DIR}/src/driver/inc
    ${PROJECT_SOURCE_DIR}/src/driver/private_inc)

add_library(pmx_headers INTERFACE)
target_include_directories(pmx_headers INTERFACE ${PMX_HEADER_DIRECTORIES})
