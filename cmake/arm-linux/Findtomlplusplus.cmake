include(${CMAKE_CURRENT_LIST_DIR}/HostHeaders.cmake)
pmx_host_headers(tomlplusplus::tomlplusplus toml++)
set(tomlplusplus_FOUND TRUE)
