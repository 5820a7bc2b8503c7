// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A decoded log for people, on 80 columns, and for programs, as JSON. */
#pragma once

#include <iosfwd>
#include <optional>
#include <string>
#include <string_view>

#include "tools/pmxboard/decode/against.h"
#include "tools/pmxboard/decode/log.h"
#include "tools/pmxboard/decode/story.h"
#include "tools/pmxboard/text/paint.h"

namespace pmxboard::decode
{

struct ShowOptions
{
    bool quiet = false;   ///< problems alone
    bool verbose = false; ///< every line, with operation and step
    Paint paint;
    std::string name; ///< how the log is called
};

void show_log(std::ostream& out, const Log& log, const Story& story, const ShowOptions& options);
void show_comparison(std::ostream& out, const Comparison& comparison, const ShowOptions& options);

/** One JSON object, its keys described in docs/decode.md. */
void show_json(std::ostream& out, const Log& log, const Story& story, const std::optional<Comparison>& comparison,
               const std::string& name);

/** The table of texts: for people, and as a JSON list. */
void show_texts(std::ostream& out);
void show_texts_json(std::ostream& out);

} // namespace pmxboard::decode
