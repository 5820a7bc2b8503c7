// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/play.h"

#include <algorithm>
#include <cstring>
#include <map>
#include <optional>
#include <sstream>
#include <vector>

#include "board/value.h"
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "recorder/encoding.h"
#include "tools/pmxboard/commands/play_steps.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/recording/described.h"
#include "tools/pmxboard/recording/recorded_run.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/record_view/record_layout.h"

namespace pmxboard
{
namespace
{

constexpr std::uint32_t recording_size = 1 << 22;
const std::vector<std::uint32_t> no_words;

/** An operation that nobody calls from within it, and what is prepared for it. */
struct PlayedCommand
{
    std::vector<std::string> before;
    std::string line;
    std::map<std::string, unsigned> faults; ///< the last call of each function that has one
};

std::string list_of(std::span<const std::uint32_t> words, std::size_t item, std::size_t size)
{
    std::string list;
    const auto* const bytes = reinterpret_cast<const unsigned char*>(words.data());
    for (std::size_t at = 0; at + item <= std::min(size, words.size_bytes()); at += item)
    {
        std::uint32_t value = 0;
        std::memcpy(&value, bytes + at, item);
        list += (list.empty() ? "" : ", ") + std::to_string(item == 4 ? static_cast<INT32>(value) : value);
    }
    return "[" + list + "]";
}

std::string number(std::uint32_t word)
{
    return std::to_string(static_cast<INT32>(word));
}

std::string outputs_of_mode(std::span<const std::uint32_t> words)
{
    std::string text;
    for (std::size_t i = 0; i < PMX_OUTPUT_NUM; ++i)
    {
        PMX_RESOLUTION_T output{};
        const auto* const from = reinterpret_cast<const char*>(words.data()) + i * sizeof output;
        if ((i + 1) * sizeof output <= words.size_bytes())
            std::memcpy(&output, from, sizeof output);
        const auto& port = output.eCcirDrvInfo;
        text += (text.empty() ? "" : ", ") + ("{fgOutputEnable=" + std::to_string(output.fgOutputEnable)) +
                ", eResMode=" + number(output.eResMode) + ", u4VFreq=" + number(output.u4VFreq) + ", eCcirDrvInfo={" +
                number(port.eDgoMode) + ", " + number(port.eDgoFmt) + ", " + number(port.eDgiMode) + ", " +
                number(port.eDgiFmt) + "}}";
    }
    return "[ " + text + " ]";
}

/** A video plane that comes or goes: its driver has a table, too, which the board's publishes then. */
std::optional<std::string> source_line(const RecordedStep& step)
{
    constexpr std::size_t planes = 4;
    const std::string& name = step.function->name;
    const std::uint32_t mixers[] = { PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP };
    const bool is_plane = step.words.size() == 4 && std::equal(mixers, mixers + 3, step.words.begin());
    if (!is_plane || step.words[3] >= planes || (name != "i4Pmx_Connect" && name != "i4Pmx_Disconnect"))
        return std::nullopt;
    return "source vdp" + std::to_string(step.words[3]) + (name == "i4Pmx_Connect" ? " connect" : " disconnect");
}

/** The operation's line; nothing when it has values that no line can have, or a text that is not known whole. */
std::optional<std::string> line_of(const RecordedStep& step)
{
    if (const auto source = source_line(step))
        return source;
    std::string line = step.function->name;
    std::span<const std::uint32_t> words = step.words;
    for (const DescribedParameter& parameter : step.function->parameters)
    {
        if (parameter.kind == "values")
            return words.empty() ? std::optional(line) : std::nullopt;
        const std::uint32_t word = words.empty() ? 0 : words.front();
        words = words.subspan(std::min<std::size_t>(1, words.size()));
        if (parameter.kind != "data" && parameter.kind != "place" && parameter.kind != "text")
        {
            line += " " + (parameter.name.starts_with("i4") ? number(word) : std::to_string(word));
            continue;
        }
        const std::size_t size = std::min<std::size_t>(PMX_KEPT(word), words.size_bytes());
        if ((word & PMX_CUT) != 0 && size != 0)
            return std::nullopt;
        const auto bytes = words.first(PMX_WORDS(size));
        words = words.subspan(bytes.size());
        if ((word & PMX_PRESENT) == 0)
            line += " null";
        else if (parameter.kind == "text")
            line += " " + board::quote(std::string(reinterpret_cast<const char*>(bytes.data()), size));
        else if (parameter.kind == "data")
            line += " " + (parameter.name == "prOutConf" ? outputs_of_mode(bytes) : list_of(bytes, 4, size));
    }
    return line;
}

/** What a fault sets an output to; nothing where no line says it. */
std::optional<std::string> output_of(const DescribedParameter& parameter, std::span<const std::uint32_t> words)
{
    if (parameter.name.starts_with("ph"))
        return number(words.front());
    if (parameter.name == "pi4PlnDelay")
        return list_of(words, 4, words.size_bytes());
    if (parameter.name == "pu1PlnSel" || parameter.name == "pvDest")
        return list_of(words, 1, words.size_bytes());
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query;
    if (parameter.name != "pvParameter" || words.size_bytes() < sizeof query)
        return std::nullopt;
    std::memcpy(&query, words.data(), sizeof query);
    return "{u4ResCheck=" + std::to_string(query.u4ResCheck) + ", u2VsyncFreq=" + std::to_string(query.u2VsyncFreq) +
           ", u4ValidAutoRes=" + std::to_string(query.u4ValidAutoRes) +
           ", u2ValidAutoVfreq=" + std::to_string(query.u2ValidAutoVfreq) + "}";
}

/** The fault by which a call answers so, the n-th from where it stands. */
std::optional<std::string> fault_of(const RecordedStep& end, unsigned nth)
{
    if (!end.function->has_result)
        return std::nullopt;
    std::string line = "fault " + end.function->name + " " + number(end.answer) + " on " + std::to_string(nth);
    for (const DescribedParameter& parameter : end.function->parameters)
    {
        const bool is_output = parameter.kind == "place" || parameter.name == "pvParameter";
        if (!is_output || end.words.empty() || static_cast<INT32>(end.answer) < 0)
            continue;
        const auto value = output_of(parameter, end.words);
        if (!value)
            return std::nullopt;
        line += " " + parameter.name + "=" + *value;
    }
    return line;
}

/** Pokes of all fields that are not there what is wanted; of all fields, where nothing is known of it. */
void fields_of(const record_view::Node& node, const std::string& path, const unsigned char* wanted,
               const unsigned char* there, std::vector<std::string>& lines)
{
    const bool is_single = record_view::is_single(node);
    if (is_single && (there == nullptr || std::memcmp(wanted, there, node.size) != 0))
        lines.push_back("poke " + path + " " + record_view::value_at(node, wanted).to_text());
    for (std::size_t i = 0; !is_single && i < node.children.size(); ++i)
    {
        const record_view::Node& child = node.children[i];
        fields_of(child, record_view::path_of_child(node, i, path), wanted + child.offset,
                  there == nullptr ? nullptr : there + child.offset, lines);
    }
}

std::vector<std::string> pokes_of(std::span<const std::uint32_t> wanted, std::span<const std::uint32_t> there)
{
    std::vector<std::string> lines;
    const auto* const from = reinterpret_cast<const unsigned char*>(wanted.data());
    const auto* const now = reinterpret_cast<const unsigned char*>(there.data());
    for (const Variable& variable : replayed_layer().variables)
    {
        for (const record_view::Object& object : record_view::objects())
        {
            if (object.symbol == variable.name && variable.offset + variable.size <= wanted.size_bytes())
                fields_of(object.node, object.group == "record" ? "" : object.symbol, from + variable.offset,
                          there.empty() ? nullptr : now + variable.offset, lines);
        }
    }
    return lines;
}

/** The state of the layer that the board has. */
std::vector<std::uint32_t> state_of_board()
{
    std::vector<std::uint32_t> state(PMX_WORDS(replayed_layer().state_size));
    auto* const to = reinterpret_cast<unsigned char*>(state.data());
    for (const Variable& variable : replayed_layer().variables)
    {
        for (const record_view::Object& object : record_view::objects())
        {
            if (object.symbol == variable.name)
                std::memcpy(to + variable.offset, record_view::address_of(object), variable.size);
        }
    }
    return state;
}

class Play
{
public:
    Play(const Recording& recording, const std::string& name) : m_name(name), m_recorded(recorded_steps(recording)) {}

    PlayedScenario write();
    std::string refusal(std::size_t operation);

private:
    void write_commands();
    std::string text(std::size_t commands) const;
    void run(const std::string& text, std::string& wrong) const;
    std::vector<RecordedStep> played(std::string& wrong) const;
    std::vector<std::uint32_t> state_before(std::size_t command) const;
    bool mend(const std::vector<RecordedStep>& now, const std::string& wrong);
    bool add_fault(const RecordedStep& end);
    bool add_misuses(const std::string& wrong);
    bool add(const RecordedStep& step, const std::string& line);
    bool add_change(std::size_t number, std::span<const std::uint32_t> there);
    bool add_pokes(const RecordedStep& step, std::span<const std::uint32_t> instead);
    bool give_up(const std::string& why);

    std::string m_name;
    RecordedSteps m_recorded;
    std::vector<std::uint32_t> m_fresh; ///< the state behind a power-on
    std::vector<PlayedCommand> m_commands;
    std::string m_end; ///< what no line can say
};

bool Play::give_up(const std::string& why)
{
    m_end = "# " + why + "\n";
    return false;
}

/** Operations as they stand; those that somebody calls from within a call, meanwhile. */
void Play::write_commands()
{
    for (const RecordedStep& step : m_recorded.steps)
    {
        if (step.kind != RecordedStep::Kind::Operation)
            continue;
        const auto line = line_of(step);
        const std::string said =
            line.value_or("# missing: all of the text, or the values that go with it, of " + step.function->name);
        if (step.command > m_commands.size())
            m_commands.push_back({ {}, said, {} });
        else if (line)
            add(step, *line);
    }
}

/** A line before the operation, or for the moment when a call of it runs. */
bool Play::add(const RecordedStep& step, const std::string& line)
{
    std::vector<std::string>& before = m_commands[step.command - 1].before;
    const std::string said =
        step.within.empty() ? line : "meanwhile " + step.within + " on " + std::to_string(step.within_nth) + " " + line;
    if (std::find(before.begin(), before.end(), said) != before.end())
        return give_up("missing: " + line + " is said, and the board does otherwise");
    before.push_back(said);
    return true;
}

/** What changed within a call may be what the call has written behind its pointers. */
bool Play::add_change(std::size_t number, std::span<const std::uint32_t> there)
{
    const RecordedStep& step = m_recorded.steps[number];
    const auto ends = [&step](const RecordedStep& other) {
        return other.kind == RecordedStep::Kind::CallEnds && other.command == step.command &&
               other.nth == step.within_nth && other.function->name == step.within;
    };
    const auto from = m_recorded.steps.begin() + static_cast<std::ptrdiff_t>(number);
    const auto end = step.within.empty() ? m_recorded.steps.end() : std::find_if(from, m_recorded.steps.end(), ends);
    const bool writes = end != m_recorded.steps.end() && !end->words.empty() && fault_of(*end, 1);
    if (writes && m_commands[end->command - 1].faults[end->function->name] < end->nth)
        return add_fault(*end);
    return add_pokes(step, there);
}

/** What somebody outside has done to the layer's objects: between operations it is seen what that was. */
bool Play::add_pokes(const RecordedStep& step, std::span<const std::uint32_t> instead)
{
    RecordedStep at = step;
    const bool is_between = step.within.empty();
    at.command += is_between ? 1 : 0;
    if (at.command > m_commands.size())
        m_commands.push_back({});
    if (is_between && step.words.size() == m_fresh.size() && pokes_of(step.words, m_fresh).empty())
        return add(at, "power-on");
    const std::size_t exported = PMX_WORDS(replayed_layer().exported_size);
    const auto there =
        is_between ? state_before(at.command) : std::vector<std::uint32_t>(instead.begin(), instead.end());
    const std::span<const std::uint32_t> wanted = step.words;
    const auto lines = pokes_of(is_between ? wanted : wanted.first(std::min(exported, wanted.size())), there);
    if (lines.empty())
        return give_up("missing: what somebody has changed behind the layer's back");
    return std::all_of(lines.begin(), lines.end(), [&](const std::string& line) { return add(at, line); });
}

std::string Play::text(std::size_t commands) const
{
    std::string lines = "# What " + printable(m_name, m_name.size() * 4) + " has recorded.\npower-on\n";
    for (std::size_t i = 0; i < std::min(commands, m_commands.size()); ++i)
    {
        for (const std::string& line : m_commands[i].before)
            lines += line + "\n";
        lines += m_commands[i].line.empty() ? "" : m_commands[i].line + "\n";
    }
    return lines;
}

void Play::run(const std::string& text, std::string& wrong) const
{
    std::istringstream lines(text);
    std::ostringstream shown;
    std::ostringstream told;
    OutputOptions output;
    output.quiet = true;
    output.to = &shown;
    run_scenario(lines, { m_name, "default", "" }, output, told);
    wrong = told.str();
}

std::vector<RecordedStep> Play::played(std::string& wrong) const
{
    const std::string bytes = recorded(recording_size, [&] { run(text(m_commands.size()) + m_end, wrong); });
    return recorded_steps(read_recording(bytes)).steps;
}

std::vector<std::uint32_t> Play::state_before(std::size_t command) const
{
    std::string wrong;
    run(text(command - 1), wrong);
    return state_of_board();
}

/** A function has one fault at a time: another one is set when the first has answered. */
bool Play::add_fault(const RecordedStep& end)
{
    unsigned& last = m_commands[end.command - 1].faults[end.function->name];
    const auto fault = fault_of(end, end.nth - last);
    if (!fault || end.nth <= last)
        return give_up("missing: what " + end.function->name + " has answered, the " + std::to_string(end.nth) +
                       ". time, cannot be said");
    RecordedStep at = end;
    at.within = last == 0 ? "" : end.function->name;
    at.within_nth = last;
    last = end.nth;
    return add(at, *fault);
}

/** A platform that the layer had misused there, too. */
bool Play::add_misuses(const std::string& wrong)
{
    constexpr std::string_view told = "the platform was misused ";
    const std::size_t at = wrong.find(told);
    if (at == wrong.npos || !m_end.empty())
        return give_up("missing: " + printable(wrong.substr(0, wrong.find('\n'))));
    const std::string count = wrong.substr(at + told.size());
    m_end = "expect misuses " + count.substr(0, count.find(' ')) + "\n";
    return true;
}

/** Adds what the first difference needs; false when there is none, or nothing to be done about it. */
bool Play::mend(const std::vector<RecordedStep>& now, const std::string& wrong)
{
    for (std::size_t i = 0; i < m_recorded.steps.size(); ++i)
    {
        const RecordedStep& step = m_recorded.steps[i];
        if (i < now.size() && same(step, now[i]))
            continue;
        if (step.kind == RecordedStep::Kind::Change)
            return add_change(i, i < now.size() && now[i].kind == step.kind ? now[i].words : no_words);
        const bool is_other_answer =
            i < now.size() && step.kind == RecordedStep::Kind::CallEnds &&
            (now[i].within == step.function->name || (now[i].kind == step.kind && now[i].function == step.function));
        if (is_other_answer)
            return add_fault(step);
        return i >= now.size() && !wrong.empty()
                   ? add_misuses(wrong)
                   : give_up("missing: on the board " + step.function->name + " goes on otherwise from here");
    }
    if (now.size() > m_recorded.steps.size())
        return give_up("missing: on the board more happens than that");
    return !wrong.empty() && add_misuses(wrong);
}

PlayedScenario Play::write()
{
    constexpr std::size_t most = 1024; // lines that are added
    write_commands();
    m_fresh = state_before(1);
    const auto pokes = pokes_of(m_recorded.state, m_fresh);
    if (!m_commands.empty())
        m_commands.front().before.insert(m_commands.front().before.begin(), pokes.begin(), pokes.end());
    std::string wrong;
    bool is_going_on = true;
    for (std::size_t round = 0; round < most && is_going_on; ++round)
    {
        const std::vector<RecordedStep> now = played(wrong);
        is_going_on = mend(now, wrong);
    }
    return { text(m_commands.size()) + m_end, !is_going_on && !m_end.starts_with("#") };
}

std::string Play::refusal(std::size_t operation)
{
    write();
    if (operation == 0 || operation > m_commands.size() || m_commands[operation - 1].line.empty())
        return {};
    std::string lines = "trace off\n" + text(operation - 1);
    for (const std::string& line : m_commands[operation - 1].before)
        lines += line + "\n";
    std::istringstream in(lines + "explain " + m_commands[operation - 1].line + "\n");
    std::ostringstream shown;
    std::ostringstream told;
    OutputOptions output;
    output.echo = false;
    output.to = &shown;
    run_scenario(in, { m_name, "default", "" }, output, told);
    const std::string all = shown.str();
    const std::size_t at = all.rfind("  refused:");
    return at == all.npos ? "" : all.substr(at);
}

} // namespace

std::string refusal_of(const Recording& recording, std::size_t operation)
{
    return Play(recording, "the recording").refusal(operation);
}

PlayedScenario scenario_of(const Recording& recording, const std::string& name)
{
    return Play(recording, name).write();
}

} // namespace pmxboard
