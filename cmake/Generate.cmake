# SPDX-License-Identifier: MIT OR GPL-2.0-only
# What is written from the headers when it is needed: the headers are the one place that tells it.
set(PMX_DECLARATIONS "")
foreach(directory ${PMX_HEADER_DIRECTORIES})
    pmx_files(found ${directory}/*.h)
    list(APPEND PMX_DECLARATIONS ${found})
endforeach()
pmx_files(PMX_GENERATORS ${CMAKE_CURRENT_LIST_DIR}/*.py)

# pmx_generate(<target> <name>.cpp <script> [<file>...]): a source of the target that a script of this folder writes,
# which is given the files, too.
function(pmx_generate target name script)
    set(output ${CMAKE_CURRENT_BINARY_DIR}/${name})
    add_custom_command(
        OUTPUT ${output}
        COMMAND Python3::Interpreter ${PROJECT_SOURCE_DIR}/cmake/${script} ${output} ${ARGN}
        DEPENDS ${PMX_GENERATORS} ${PMX_DECLARATIONS} ${PROJECT_SOURCE_DIR}/board/names.h
            ${PROJECT_SOURCE_DIR}/src/driver/pmx/pmx_if.h ${ARGN}
        COMMENT "Writing ${name} from the headers"
        VERBATIM)
    target_sources(${target} PRIVATE ${output})
endfunction()
