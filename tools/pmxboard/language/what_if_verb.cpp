// SPDX-License-Identifier: MIT OR GPL-2.0-only
// `what-if`: a command in a copy of the process, which ends with it.
#include "board/threads.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/apart.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"

namespace pmxboard
{
namespace
{

/** How an answer begins, to tell what became of the command. */
constexpr char done = 'd';
constexpr char wrong_line = 'w';
constexpr char failed = 'f';

std::string became_of(Session& session, const std::string& command, std::ostream& shown)
{
    try
    {
        session.imagine(command, shown);
        return done + to_json(session.last_outcome());
    }
    catch (const LineError& error)
    {
        return std::string(1, wrong_line) + error.what();
    }
    catch (const std::exception& error)
    {
        return std::string(1, failed) + error.what();
    }
}

void what_if(Session& session, const Words& words)
{
    const std::string command = words.from("COMMAND");
    if (words.at("COMMAND") == "expect")
        throw LineError("what-if takes a command; an expectation looks at what a command did");
    if (const auto waiting = board::threads::waiting(); !waiting.empty())
        throw StepFailed("what-if copies the process, and a thread that waits cannot be copied: " + waiting.front());
    session.output().flush();
    const Apart apart = run_apart([&](std::ostream& shown) { return became_of(session, command, shown); });
    const std::string message = apart.answer.empty() ? std::string() : apart.answer.substr(1);
    const bool well = apart.death.empty() && !apart.answer.empty();
    if (well && apart.answer.front() == wrong_line)
        throw LineError(message);
    const bool would_be_done = well && apart.answer.front() == done;
    session.output().imagined(command, apart.shown, would_be_done ? message : "null");
    if (!well)
        session.output().remark("  would end the program: " + apart.death);
    else if (apart.answer.front() == failed)
        session.output().remark("  would fail: " + message);
}

} // namespace

std::vector<Verb> what_if_verbs()
{
    return {
        { "what-if",
          { { "what-if COMMAND", "show the calls and the result that a command would have, and change nothing", what_if,
              looks } } },
    };
}

} // namespace pmxboard
