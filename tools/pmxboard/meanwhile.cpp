// `meanwhile …`: commands that run from inside a platform call, as a neighbour's thread or an interrupt would.
#include <algorithm>
#include <iterator>
#include <limits>
#include <optional>
#include <span>
#include <stdexcept>

#include "board/meanwhile.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/step_error.h"
#include "tools/pmxboard/verb_usage.h"
#include "tools/pmxboard/verb_words.h"

namespace pmxboard
{
namespace
{

constexpr std::string_view outputs[] = { "digital", "hdmi", "component", "composite" }; ///< by index

/** What the caller of a mode change writes into its own request while that runs. */
struct Request
{
    std::size_t output = 0;
    std::optional<BOOL> enable;
    PMX_RESOLUTION_MODE_T mode{}; ///< unless it is a switch
};

/** `request OUTPUT MODE|on|off` */
Request read_request(const Line& command)
{
    if (command.size() != 3)
        throw LineError("write: request digital|hdmi|component|composite MODE|on|off");
    Request request;
    const auto output = std::find(std::begin(outputs), std::end(outputs), command.word(1));
    if (output == std::end(outputs))
        throw LineError("there is no output " + command.word(1) +
                        did_you_mean(command.word(1), { std::begin(outputs), std::end(outputs) }));
    request.output = static_cast<std::size_t>(output - std::begin(outputs));
    const std::string& value = command.word(2);
    if (value == "on" || value == "off")
    {
        request.enable = value == "on" ? TRUE : FALSE;
        return request;
    }
    const Kind mode{ .bits = 32, .family = board::names::Family::ResolutionMode, .names = {}, .members = {} };
    request.mode = static_cast<PMX_RESOLUTION_MODE_T>(read_value(mode, value, "the request's mode").as_number());
    return request;
}

void change_request(const Request& request)
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
    if (name == "request")
    {
        read_request(command);
        return;
    }
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
    if (found.verb->only_looks)
        throw LineError(name + " only looks, and meanwhile is for what somebody else does; look behind the command "
                               "that it happens in");
    if (!fits(found.verb->usage, command.words()))
        wrong_usage(command);
}

/** The words behind `meanwhile`. */
struct Written
{
    bool as_thread = false;
    std::string function; ///< empty: `meanwhile off`
    unsigned n = 1;
    std::string command; ///< empty: take it back
};

Written read(const Line& line)
{
    Written written;
    std::size_t at = 1;
    if (line.size() == 2 && line.word(1) == "off")
        return written;
    if (line.size() > 2 && line.word(1) == "as" && line.word(2) == "thread")
    {
        written.as_thread = true;
        at = 3;
    }
    if (line.size() < at + 2)
        wrong_usage(line);
    written.function = line.word(at++);
    need_platform_function(written.function);
    if (line.word(at) == "off" && line.size() == at + 1 && !written.as_thread)
        return written;
    if (line.word(at) == "on")
    {
        if (line.size() < at + 3)
            wrong_usage(line);
        written.n = static_cast<unsigned>(
            number_in(line.word(at + 1), "the call's number", 1, std::numeric_limits<std::int32_t>::max()));
        at += 2;
    }
    written.command = line.from(at);
    return written;
}

/** Carried out inside the call. What goes wrong is told with the meanwhile that it belongs to. */
void happen(Session& session, const std::string& meanwhile, const std::string& written, bool as_thread)
{
    board::trace::notice("meanwhile", (as_thread ? "as thread " : "") + written);
    try
    {
        const Line command(written);
        if (command.word(0) == "request")
            change_request(read_request(command));
        else
            session.run_meanwhile(command);
    }
    catch (const std::exception& error)
    {
        throw StepFailed(meanwhile + ": " + error.what());
    }
}

} // namespace

void run_meanwhile(Session& session, const Line& line)
{
    const Written written = read(line);
    if (written.function.empty())
        board::meanwhiles::forget_all();
    else if (written.command.empty())
        board::meanwhiles::forget(written.function);
    if (written.command.empty())
        return;
    check_command(Line(written.command));
    const std::string meanwhile = line.from(0);
    board::meanwhile(written.function, written.n,
                     [&session, meanwhile, command = written.command, as_thread = written.as_thread] {
                         happen(session, meanwhile, command, as_thread);
                     },
                     { written.as_thread, meanwhile });
}

} // namespace pmxboard
