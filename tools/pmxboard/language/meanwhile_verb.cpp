// SPDX-License-Identifier: MIT OR GPL-2.0-only
// `meanwhile …`: commands that run from inside a platform call, as a neighbour's thread or an interrupt would.
#include <algorithm>
#include <functional>
#include <iterator>
#include <limits>
#include <optional>
#include <span>
#include <stdexcept>

#include "board/meanwhile.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

/** What the caller of a mode change writes into its own request while that runs. */
struct Request
{
    std::size_t output = 0;
    std::optional<BOOL> enable;
    PMX_RESOLUTION_MODE_T mode{}; ///< unless it is a switch
};

Request read_request(const Words& words)
{
    Request request;
    request.output = output_called(words.at("OUTPUT"));
    if (words.has("MODE"))
        request.mode = static_cast<PMX_RESOLUTION_MODE_T>(
            named_number(words.at("MODE"), "the request's mode", board::names::Family::ResolutionMode));
    else
        request.enable = words.line().words().back() == "on" ? TRUE : FALSE;
    return request;
}

void change(const Request& request)
{
    const std::span<PMX_RESOLUTION_T> lent = LentOutputs::innermost();
    if (lent.size() <= request.output)
        throw StepFailed("no PMX_SetModeEx is running whose request could change");
    PMX_RESOLUTION_T& entry = lent[request.output];
    if (request.enable)
        entry.fgOutputEnable = *request.enable;
    else
        entry.eResMode = request.mode;
}

/** Refuses what can never be meant, before anything runs. What the state of that moment decides is found out then. */
void check_command(const Line& command)
{
    const std::string& name = command.word(0);
    const Command found = find_command(name);
    if (found.operation != nullptr)
    {
        read_arguments(*found.operation, std::span(command.words()).subspan(1));
        return;
    }
    if (name == "meanwhile")
        throw LineError(
            "meanwhile takes a command that somebody else gives; each meanwhile stands on a line of its own");
    if (name == "power-on")
        throw LineError("power-on would take the board away from under the operation that is running");
    if (name == "restore")
        throw LineError("restore would take the board away from under the operation that is running");
    if (name == "include")
        throw LineError("include carries out many lines; each meanwhile is one command");
    if (only_looks(command))
        throw LineError(name + " only looks, and meanwhile is for what somebody else does; look behind the command "
                               "that it happens in");
    read_form(*found.verb, command);
}

/** Has something happen inside a call. What goes wrong is told with the meanwhile that it belongs to. */
void arm(const Words& words, const std::string& written, const std::function<void()>& happen)
{
    const auto n = words.has("N") ? static_cast<unsigned>(number_in(words.at("N"), "the call's number", 1,
                                                                    std::numeric_limits<std::int32_t>::max()))
                                  : 1u;
    const bool as_thread = words.has("thread");
    const std::string meanwhile = words.line().from(0);
    const auto carry_out = [meanwhile, written, happen, as_thread] {
        board::trace::notice("meanwhile", (as_thread ? "as thread " : "") + written);
        try
        {
            happen();
        }
        catch (const std::exception& error)
        {
            throw StepFailed(meanwhile + ": " + error.what());
        }
    };
    board::meanwhile(words.at("FUNCTION"), n, carry_out, { as_thread, meanwhile });
}

void run_command(Session& session, const Words& words)
{
    need_platform_function(words.at("FUNCTION"));
    const Line command(words.from("COMMAND"));
    check_command(command);
    arm(words, command.from(0), [&session, command] { session.run_meanwhile(command); });
}

void run_request(Session&, const Words& words)
{
    need_platform_function(words.at("FUNCTION"));
    const Request request = read_request(words);
    arm(words, words.from("request"), [request] { change(request); });
}

void forget_function(Session&, const Words& words)
{
    need_platform_function(words.at("FUNCTION"));
    board::meanwhiles::forget(words.at("FUNCTION"));
}

void forget_all(Session&, const Words&)
{
    board::meanwhiles::forget_all();
}

} // namespace

std::vector<Verb> meanwhile_verbs()
{
    return {
        { "meanwhile",
          { { "meanwhile [as thread] FUNCTION [on N] COMMAND",
              "when this platform function is called next, or for the n-th time from now, the command runs inside the "
              "call; `as thread`, in a thread of its own, which can wait for the mutex",
              run_command },
            { "meanwhile [as thread] FUNCTION [on N] request OUTPUT MODE|on|off",
              "the caller of the running `PMX_SetModeEx` changes what it asked for: OUTPUT is `digital`, `hdmi`, "
              "`component` or `composite`",
              run_request },
            { "meanwhile FUNCTION off", "take back what is armed for a function", forget_function },
            { "meanwhile off", "take back everything that is armed", forget_all } } },
    };
}

} // namespace pmxboard
