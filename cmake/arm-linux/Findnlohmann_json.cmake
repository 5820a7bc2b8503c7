# SPDX-License-Identifier: MIT OR GPL-2.0-only
include(${CMAKE_CURRENT_LIST_DIR}/HostHeaders.cmake)
pmx_host_headers(nlohmann_json::nlohmann_json nlohmann)
set(nlohmann_json_FOUND TRUE)
