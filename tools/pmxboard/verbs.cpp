#include <algorithm>
#include <limits>

#include "board/board.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/state_paths.h"
#include "tools/pmxboard/step_error.h"
#include "tools/pmxboard/verb_words.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

void power_on(Session& session, const Line& line)
{
    need_words(line, 1, 2);
    session.power_on(line.size() == 2 ? line.word(1) : std::string());
}

/** Only a partition that is there can be removed. */
void need_partition(const std::string& name)
{
    const board::Value state = board::state();
    std::vector<std::string_view> known;
    for (const board::Value& partition : state.find("flash.partitions")->items())
        known.push_back(partition.find("name")->string());
    if (std::find(known.begin(), known.end(), name) == known.end())
        throw LineError("there is no flash partition " + name + did_you_mean(name, known));
}

void flash(Session& session, const Line& line)
{
    need_words(line, 3, 3);
    if (line.word(2) == "off")
        need_partition(line.word(1));
    try
    {
        board::set_flash(line.word(1), line.word(2) == "off" ? std::filesystem::path() : session.file(line.word(2)));
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
}

void fault(Session&, const Line& line)
{
    need_words(line, 3, 5);
    const std::string& function = line.word(1);
    need_platform_function(function);
    if (line.word(2) == "off" && line.size() == 3)
    {
        board::faults::clear(function);
        return;
    }
    board::Fault scripted;
    scripted.function = function;
    const auto family = board::names::family_of(function, "result");
    scripted.answer = read_number(family, line.word(2), "the answer");
    if (scripted.answer < std::numeric_limits<std::int32_t>::min() ||
        scripted.answer > std::numeric_limits<std::uint32_t>::max())
        throw LineError("the answer has 32 bits, and " + line.word(2) + " does not fit");
    if (line.size() > 3)
    {
        const bool has_number = line.word(3) == "on" || line.word(3) == "from";
        if ((!has_number && line.word(3) != "always") || line.size() != (has_number ? 5 : 4))
            wrong_usage(line);
        scripted.when = line.word(3) == "on"     ? board::Fault::When::On
                        : line.word(3) == "from" ? board::Fault::When::From
                                                 : board::Fault::When::Always;
        if (has_number)
            scripted.n = static_cast<unsigned>(
                number_in(line.word(4), "the call's number", 1, std::numeric_limits<std::int32_t>::max()));
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

void advance(Session&, const Line& line)
{
    need_words(line, 2, 2);
    board::advance(read_time(line, line.word(1)));
}

void loglevel(Session&, const Line& line)
{
    need_words(line, 2, 2);
    board::set_console_level(static_cast<int>(number_in(line.word(1), "the console's level", -1, 1000)));
}

void poke(Session&, const Line& line)
{
    need_words(line, 3, 3);
    try
    {
        const board::trace::By scope(Session::is_meanwhile() ? "meanwhile" : "poke");
        const record_view::FieldType field = record_view::type_of(line.word(1));
        const auto family = board::names::family_of(field.record, field.member);
        record_view::set(line.word(1), read_number(family, line.word(2), field.path));
    }
    catch (const record_view::FieldError& error)
    {
        throw LineError(error.what());
    }
}

void trace(Session& session, const Line& line)
{
    need_words(line, 2, 2);
    session.output().show_trace(read_switch(line, line.word(1)));
}

void stores(Session& session, const Line& line)
{
    need_words(line, 2, 2);
    session.watch_stores(read_switch(line, line.word(1)));
}

void suspend(Session& session, const Line& line)
{
    need_words(line, 1, 1);
    session.set_outcome("suspend", { board::Value::number(board::suspend()), {} });
}

void resume(Session& session, const Line& line)
{
    need_words(line, 1, 1);
    session.set_outcome("resume", { board::Value::number(board::resume()), {} });
}

void print(Session& session, const Line& line)
{
    need_words(line, 2, 2);
    session.output().text(read_text(line, line.word(1)));
}

void neighbour(Session& session, const Line& line)
{
    if (line.size() < 2)
        wrong_usage(line);
    const Operation* const operation = find(neighbours(), line.word(1));
    if (operation == nullptr)
        throw LineError("a neighbour cannot call " + line.word(1) + " here" +
                        did_you_mean(line.word(1), names_of(neighbours())));
    const Values values = read_arguments(*operation, std::span(line.words()).subspan(2));
    session.set_outcome(operation->name, operation->run(values));
}

void expectation(Session& session, const Line& line)
{
    check_expectation(session, line);
}

} // namespace

const std::vector<Verb>& verbs()
{
    static const std::vector<Verb> all = {
        { "power-on", "power-on [BOARD]", power_on },
        { "flash", "flash PARTITION FILE, or flash PARTITION off", flash },
        { "fault", "fault FUNCTION ANSWER [on N|from N|always], or fault FUNCTION off", fault },
        { "advance", "advance 10s, 500ms or 2us", advance },
        { "loglevel", "loglevel LEVEL", loglevel },
        { "state", "state [PATH…] [--json]", run_state, true },
        { "save", "save FILE", run_save, true },
        { "diff", "diff [PATH…] [--json]", run_diff, true },
        { "what-if", "what-if COMMAND", run_what_if, true },
        { "meanwhile",
          "meanwhile FUNCTION [on N] COMMAND, meanwhile as thread FUNCTION [on N] COMMAND, "
          "meanwhile FUNCTION [on N] request digital|hdmi|component|composite MODE|on|off, meanwhile FUNCTION off, "
          "or meanwhile off",
          run_meanwhile },
        { "poke", "poke FIELD VALUE", poke },
        { "trace", "trace on, or trace off", trace, true },
        { "stores", "stores on, or stores off", stores, true },
        { "suspend", "suspend", suspend },
        { "resume", "resume", resume },
        { "sink", "sink plug, sink unplug, sink request-resolution [on|off], sink valid MODE HZ, or sink valid asked",
          run_sink },
        { "display-part", "display-part off|never|raise|lower, or display-part answer TIME", run_display_part },
        { "video-plane", "video-plane waiting on|off, or video-plane hw-enable PLANE STATE", run_video_plane },
        { "source",
          "source vdp0…vdp3|osd0…osd5 connect|stop|disconnect, source vdp0…vdp3|osd0…osd5 size WxH, source VDP start "
          "WxH [luma N], "
          "source OSD start WxH ycbcr|rgb, or source VDP connects-back on|off",
          run_source },
        { "plane-delay", "plane-delay [order 0x76543210] and eight delays, plane 1 first", run_plane_delay },
        { "print", "print \"text\"", print, true },
        { "neighbour", "neighbour FUNCTION [ARGUMENT…]", neighbour },
        { "ipmx", "ipmx SLOT tag|NUMBER [ARGUMENT…]", run_ipmx },
        { "expect", "expect result|out|call|next|no-more|none|log|console|state|asserts|misuses …", expectation, true },
    };
    return all;
}

board::Value whole_state()
{
    board::Value all = board::state();
    const board::Value layer = record_view::state();
    for (std::size_t i = 0; i < layer.keys().size(); ++i)
        all.add(layer.keys()[i], layer.items()[i]);
    return all;
}

board::Value state_at(const std::string& path)
{
    const board::Value board_state = board::state();
    if (const board::Value* const found = board_state.find(path); found != nullptr && !path.empty())
        return *found;
    if (record_view::has(path))
        return record_view::get(path);
    return part_of(whole_state(), path);
}

} // namespace pmxboard
