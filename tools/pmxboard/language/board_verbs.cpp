// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Verbs for the board as a whole: power, flash, faults, time, the console.
#include <algorithm>
#include <limits>
#include <tuple>

#include "board/board.h"
#include "board/flash.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/kind.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

void power_on(Session& session, const Words& words)
{
    session.power_on(words.has("BOARD") ? file_name(words.at("BOARD")) : std::string());
}

void set_flash(const std::string& partition, const std::filesystem::path& image)
try
{
    board::set_flash(partition, image);
}
catch (const std::invalid_argument& error)
{
    throw LineError(error.what());
}

void put_flash(Session& session, const Words& words)
{
    set_flash(words.at("PARTITION"), session.file(words.at("FILE")));
}

void put_word(Session&, const Words& words)
{
    const auto word = named_number(words.at("NUMBER"), "the word", board::names::Family::ResolutionMode);
    board::set_flash_word(words.at("PARTITION"), word);
}

/** Only a partition that is there can be removed. */
void remove_flash(Session&, const Words& words)
{
    const std::string& name = words.at("PARTITION");
    const board::Value state = board::state();
    std::vector<std::string_view> known;
    for (const board::Value& partition : state.find("flash.partitions")->items())
        known.push_back(partition.find("name")->string());
    if (std::find(known.begin(), known.end(), name) == known.end())
        throw LineError("there is no flash partition " + name + did_you_mean(name, known));
    set_flash(name, {});
}

/** FUNCTION, alone or with the arguments of the calls that are meant. */
std::pair<std::string, std::string> faulted_call(const Words& words)
try
{
    auto call = board::faults::read_call(words.at("FUNCTION"));
    need_platform_function(call.first);
    return call;
}
catch (const std::invalid_argument& error)
{
    throw LineError(error.what());
}

void set_fault(Session&, const Words& words)
{
    board::Fault scripted;
    std::tie(scripted.function, scripted.arguments) = faulted_call(words);
    const std::string& answer = words.at("ANSWER");
    scripted.answer = read_number(board::names::family_of(scripted.function, "result"), answer, "the answer");
    if (scripted.answer < std::numeric_limits<std::int32_t>::min() ||
        scripted.answer > std::numeric_limits<std::uint32_t>::max())
        throw LineError("the answer has 32 bits, and " + answer + " does not fit");
    scripted.when = words.has("always") ? board::Fault::When::Always
                    : words.has("from") ? board::Fault::When::From
                    : words.has("for")  ? board::Fault::When::For
                                        : board::Fault::When::On;
    if (words.has("N"))
        scripted.n = static_cast<unsigned>(
            number_in(words.at("N"), "the call's number", 1, std::numeric_limits<std::int32_t>::max()));
    if (words.has("TIME"))
        scripted.time = read_time(words.at("TIME"));
    for (const std::string& setting : words.all("PARAMETER=VALUE"))
    {
        const std::size_t equals = setting.find('=');
        scripted.outputs.push_back({ setting.substr(0, equals), setting.substr(equals + 1) });
    }
    try
    {
        board::faults::set(scripted);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
}

void clear_fault(Session&, const Words& words)
try
{
    const auto [function, arguments] = faulted_call(words);
    if (arguments.empty())
        board::faults::clear(function);
    else
        board::faults::clear(function, arguments);
}
catch (const std::invalid_argument& error)
{
    throw LineError(error.what());
}

void clear_faults(Session&, const Words&)
{
    board::faults::clear_all();
}

/** As they can be typed again. */
void list_faults(Session& session, const Words&)
{
    std::string text;
    for (const board::Fault& fault : board::faults::active())
        text += "  fault " + board::faults::to_text(fault) + "\n";
    session.output().text(text.empty() ? "  no faults\n" : printable_lines(text));
}

void advance(Session&, const Words& words)
{
    board::advance(read_time(words.at("TIME")));
}

void loglevel(Session&, const Words& words)
{
    board::set_console_level(static_cast<int>(number_in(words.at("LEVEL"), "the console's level", -1, 1000)));
}

void suspend(Session& session, const Words&)
{
    session.set_outcome("suspend", { board::Value::number(board::suspend()), {} });
}

void resume(Session& session, const Words&)
{
    session.set_outcome("resume", { board::Value::number(board::resume()), {} });
}

} // namespace

std::vector<Verb> board_verbs()
{
    return {
        { "power-on",
          { { "power-on [BOARD]",
              "make board and layer as good as new. BOARD is a name under `boards/`, a directory or a `.toml` file, "
              "the "
              "last two also relative to the scenario. Without it: what `--board` names, else `default`. A scenario "
              "that does not begin with it starts on that board, too",
              power_on } } },
        { "flash",
          { { "flash PARTITION FILE", "put an image, a file relative to the scenario, into a partition", put_flash },
            { "flash PARTITION word NUMBER",
              "put a 32-bit word there, and nothing behind it: `flash fast_init_param word 0x0C`, or a mode by its "
              "name",
              put_word },
            { "flash PARTITION off", "remove the partition", remove_flash } } },
        { "fault",
          { { "fault FUNCTION ANSWER [on N|from N|for TIME|always] [PARAMETER=VALUE…]",
              "let a platform function answer instead of acting: at the n-th call from now (the next, when nothing is "
              "said), from it on, for a time, or always; and set its outputs. `FUNCTION(ARGUMENT, ...)` means the "
              "calls "
              "that an expectation of this form would meet",
              set_fault },
            { "fault FUNCTION off", "take it back; without arguments, all of this function", clear_fault },
            { "fault off", "take all faults back", clear_faults },
            { "fault", "list them, with the calls and the time that are left", list_faults, looks } } },
        { "advance",
          { { "advance TIME", "let virtual time pass: `10s`, `500ms` or `2us`; timers run out at their moment",
              advance } } },
        { "loglevel",
          { { "loglevel LEVEL",
              "the console prints `PMX_IsLog` lines of this level and below; the trace holds them all", loglevel } } },
        { "suspend",
          { { "suspend", "let power management run what is registered; the result is the first that is not 0",
              suspend } } },
        { "resume", { { "resume", "the same for waking up", resume } } },
    };
}

} // namespace pmxboard
