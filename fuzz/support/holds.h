// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What holds whatever is read. Where it does not, the process ends as a fuzzer takes notice of. */
#pragma once

#include <string>
#include <string_view>

namespace fuzz
{

void must(bool holds, std::string_view what);

/** A text has nothing that a terminal acts on. */
void must_be_fit(const std::string& text);

/** It is JSON: one value, or one on each line. */
void must_be_json(const std::string& text);
void must_be_json_lines(const std::string& text);

} // namespace fuzz
