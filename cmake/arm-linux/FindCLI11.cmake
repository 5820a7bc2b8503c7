# SPDX-License-Identifier: MIT OR GPL-2.0-only
include(${CMAKE_CURRENT_LIST_DIR}/HostHeaders.cmake)
pmx_host_headers(CLI11::CLI11 CLI)
set(CLI11_FOUND TRUE)
