# SPDX-License-Identifier: MIT OR GPL-2.0-only
include(${CMAKE_CURRENT_LIST_DIR}/HostHeaders.cmake)
pmx_host_headers(tomlplusplus::tomlplusplus toml++)
set(tomlplusplus_FOUND TRUE)
