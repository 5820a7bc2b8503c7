# SPDX-License-Identifier: MIT OR GPL-2.0-only
# The version stands in project(), and nowhere else. From there it goes into a header for C and C++, and into the
# objects that ship; the day of its release, which CHANGELOG.md tells, goes into whatever carries a date.
set(PMX_VERSION_DIRECTORY ${PROJECT_BINARY_DIR}/include)
configure_file(cmake/pmx_version.h.in ${PMX_VERSION_DIRECTORY}/pmx_version.h @ONLY)

set(PMX_VERSION_ASSEMBLY ${PROJECT_BINARY_DIR}/pmx_version.s)
configure_file(cmake/pmx_version.s.in ${PMX_VERSION_ASSEMBLY} @ONLY)

set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS CHANGELOG.md)
file(STRINGS CHANGELOG.md headings REGEX "^## ")
foreach(heading IN LISTS headings)
    if(heading MATCHES "^## ([^ ]+) - (....-..-..)$" AND CMAKE_MATCH_1 STREQUAL PROJECT_VERSION)
        set(PMX_VERSION_DATE ${CMAKE_MATCH_2})
    endif()
endforeach()
if(NOT PMX_VERSION_DATE)
    message(FATAL_ERROR "project() says ${PROJECT_VERSION}; CHANGELOG.md needs \"## ${PROJECT_VERSION} - YYYY-MM-DD\"")
endif()
