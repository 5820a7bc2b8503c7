// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Candidates for completion, by what stands in a place: names of functions, boards, files, fields, values. */
#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/functions/operation.h"

namespace pmxboard
{

using Candidates = std::vector<std::string>;

/** Candidates for the value that is being written at the end of a word, which may be within lists and records. */
struct ValuePart
{
    std::size_t begin = 0; ///< in the word
    Candidates candidates;
    std::string place; ///< "prOutConf[1].eResMode: one of the resolution modes"
};
ValuePart value_candidates(const Parameter& parameter, std::string_view word);

Candidates platform_names();
Candidates faultable_names(); ///< those with a result
Candidates neighbour_names();
Candidates board_names();
Candidates partition_names();
Candidates source_names(std::string_view beginning);
Candidates file_candidates(const std::filesystem::path& directory, std::string_view begun);

/** Names for an argument or field: those of its family; TRUE and FALSE where its own name says that it is a switch. */
Candidates number_names(board::names::Family family, std::string_view name);
/** Names of a family, and those that go with any number. */
Candidates names_and_general(board::names::Family family);
/** Names for an argument of a platform function. */
Candidates platform_argument_names(std::string_view function, std::size_t index);

/** What a fault may set: "phTimer=". */
Candidates settable_outputs(std::string_view function);

/** The next step of a path into board and layer, or into the layer's record alone: "mixer." goes on. */
Candidates path_candidates(std::string_view begun);
Candidates field_candidates(std::string_view begun);
/** Names for what stands at a path. */
Candidates field_value_names(const std::string& path);

/** Outputs of operations, and names for what they hold. */
Candidates output_names();
Candidates output_value_names(const std::string& output);

} // namespace pmxboard
