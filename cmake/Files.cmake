# SPDX-License-Identifier: MIT OR GPL-2.0-only
# pmx_files(<variable> <pattern>...): the files of each pattern, looked up again at every build. A pattern that finds
# none is an error: a folder was moved or misspelt, and what it holds would silently be left out.
function(pmx_files variable)
    set(all "")
    foreach(pattern ${ARGN})
        file(GLOB found CONFIGURE_DEPENDS ${pattern})
        if(NOT found)
            message(FATAL_ERROR "There is no ${pattern}")
        endif()
        list(APPEND all ${found})
    endforeach()
    set(${variable} ${all} PARENT_SCOPE)
endfunction()
