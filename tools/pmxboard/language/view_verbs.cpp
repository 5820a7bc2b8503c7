// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Verbs for what the run shows.
#include "tools/pmxboard/functions/kind.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{

std::vector<Verb> view_verbs()
{
    return {
        { "trace",
          { { "trace on", "show platform calls from here on",
              [](Session& session, const Words&) { session.output().show_trace(true); }, looks },
            { "trace off", "show them no more",
              [](Session& session, const Words&) { session.output().show_trace(false); }, looks } } },
        { "stores",
          { { "stores on",
              "have stores into the layer's objects in the trace from here on, where expectations see them",
              [](Session& session, const Words&) { session.watch_stores(true); }, looks },
            { "stores off", "or no more", [](Session& session, const Words&) { session.watch_stores(false); },
              looks } } },
        { "include",
          { { "include FILE",
              "carry out the lines of another file, named relative to this one; expectations behind it look at its "
              "last "
              "command",
              [](Session& session, const Words& words) { session.include(words.at("FILE")); }, looks } } },
        { "print",
          { { "print \"text\"", "show a text",
              [](Session& session, const Words& words) {
                  session.output().text(printable_lines(read_text(words.at("\"text\""), "the text")));
              },
              looks } } },
    };
}

} // namespace pmxboard
