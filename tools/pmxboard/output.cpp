#include "tools/pmxboard/output.h"

#include <cstdio>
#include <ostream>

namespace pmxboard
{
namespace
{

constexpr std::size_t columns = 80;

constexpr std::string_view bold = "1";
constexpr std::string_view green = "32";
constexpr std::string_view yellow = "33";
constexpr std::string_view grey = "90";

} // namespace

Output::Output(const OutputOptions& options) : m_options(options)
{
}

bool Output::is_machine_read() const
{
    return (m_options.trace == TraceForm::Json || m_options.trace == TraceForm::Chrome) &&
           m_options.trace_to == nullptr;
}

std::ostream* Output::people() const
{
    return m_options.quiet || is_machine_read() ? nullptr : m_options.to;
}

std::string Output::painted(std::string_view text, std::string_view code) const
{
    if (!m_options.colour)
        return std::string(text);
    // Each line by itself: a pager may show the second one without the first.
    const std::string begin = "\x1b[" + std::string(code) + "m";
    const std::string end = "\x1b[0m";
    std::string lines = begin;
    for (const char c : text)
        lines += c == '\n' ? end + "\n" + begin : std::string(1, c);
    return lines + end;
}

void Output::imagine(std::ostream& to)
{
    m_options.trace = for_programs() ? TraceForm::Json : TraceForm::Text;
    m_options.to = &to;
    m_options.trace_to = nullptr;
    m_options.chrome = nullptr;
    m_trace_shown = true;
}

void Output::powered_on()
{
    if (m_options.chrome != nullptr)
        m_options.chrome->powered_on();
}

void Output::operation_begins(const std::string& name)
{
    if (m_options.chrome != nullptr)
        m_options.chrome->operation_begins(name);
}

void Output::command(std::string_view line)
{
    if (m_options.chrome != nullptr)
        m_options.chrome->command(line);
    if (people() != nullptr && m_options.echo)
        *people() << painted("> " + std::string(line), bold) << '\n';
}

void Output::expectation(std::string_view line)
{
    if (people() != nullptr && m_options.verbose)
        *people() << painted("> " + std::string(line), grey) << '\n';
}

void Output::outcome(const Outcome& outcome)
{
    if (m_options.chrome != nullptr)
        m_options.chrome->operation_ends(outcome);
    flush();
    if (people() == nullptr)
        return;
    if (outcome.result)
        *people() << painted("  = " + outcome.result->to_text(), green) << '\n';
    for (const OutputValue& output : outcome.outputs)
    {
        const std::string value = output.value ? " = " + output.value->to_text() : " untouched";
        *people() << painted("  *" + output.name + value, green) << '\n';
    }
}

void Output::text(std::string_view text)
{
    flush();
    if (people() != nullptr)
        *people() << text;
}

void Output::remark(std::string_view text)
{
    flush();
    if (people() != nullptr)
        *people() << painted(text, yellow) << '\n';
}

void Output::shown(const std::string& json_line, std::string_view text)
{
    flush();
    if (for_programs())
        *m_options.to << json_line << '\n';
    else if (people() != nullptr)
        *people() << text;
}

void Output::imagined(std::string_view line, const std::string& written, const std::string& outcome)
{
    if (!for_programs())
    {
        text(written);
        return;
    }
    std::string calls = written.substr(0, written.find_last_not_of('\n') + 1);
    for (std::size_t end = calls.find('\n'); end != calls.npos; end = calls.find('\n', end))
        calls[end] = ',';
    shown("{\"kind\":\"what-if\",\"command\":" + board::Value::text(std::string(line)).to_json() + ",\"calls\":[" +
              calls + "],\"outcome\":" + outcome + "}",
          {});
}

std::string Output::render(const board::TraceEntry& entry) const
{
    if (m_options.trace == TraceForm::Json)
        return entry.to_json() + "\n";
    char time[32];
    std::snprintf(time, sizeof time, "%9llu.%03u  ", static_cast<unsigned long long>(entry.time_us / 1000),
                  static_cast<unsigned>(entry.time_us % 1000));
    const std::string lead = time + std::string(2 * static_cast<std::size_t>(entry.depth), ' ');
    const std::string line = lead + (m_options.verbose ? entry.named() : entry.brief());
    const bool remarkable =
        entry.faulted || entry.kind == board::TraceEntry::Kind::Notice || entry.kind == board::TraceEntry::Kind::Assert;
    const std::string mark = entry.faulted ? "  (scripted)" : "";
    if (m_options.trace_to != nullptr)
        return line + mark + "\n";
    const bool is_call = entry.kind == board::TraceEntry::Kind::Call;
    return painted(is_call ? folded(line + mark, lead.size() + 4) : line + mark, remarkable ? yellow : grey) + "\n";
}

void Output::entry(const board::TraceEntry& entry)
{
    // Where people read the console, a line that it shows need not stand in the trace as well.
    const bool on_console = entry.kind == board::TraceEntry::Kind::Log && entry.shown &&
                            m_options.trace == TraceForm::Text && m_options.trace_to == nullptr;
    const bool is_shown = m_trace_shown && m_options.filter.shows(entry);
    const bool as_lines = m_options.trace == TraceForm::Text || m_options.trace == TraceForm::Json;
    if (m_options.chrome != nullptr)
        m_options.chrome->entry(entry, is_shown);
    if (is_shown && as_lines && !on_console)
    {
        if (entry.depth == 0)
            write_trace(render(entry));
        else
            m_nested.push_back({ false, render(entry) });
    }
    if (entry.depth == 0)
        release_nested();
}

void Output::console(std::string_view text)
{
    const auto& entries = board::trace::entries();
    if (!entries.empty() && entries.back().depth > 0)
        m_nested.push_back({ true, std::string(text) });
    else
        write_console(text);
}

void Output::write_trace(const std::string& line)
{
    if (m_options.trace_to != nullptr)
        *m_options.trace_to << line;
    else if (for_programs())
        *m_options.to << line;
    else if (people() != nullptr)
        *people() << line;
}

void Output::write_console(std::string_view text)
{
    for (const char c : text)
    {
        if (c != '\n')
        {
            m_console_line += c;
            continue;
        }
        if (people() != nullptr)
            *people() << "  | " << m_console_line << '\n';
        m_console_line.clear();
    }
}

void Output::release_nested()
{
    const std::vector<Nested> waiting = std::move(m_nested);
    m_nested.clear();
    for (const Nested& nested : waiting)
    {
        if (nested.is_console)
            write_console(nested.text);
        else
            write_trace(nested.text);
    }
}

void Output::flush()
{
    if (m_options.chrome != nullptr)
        m_options.chrome->settle();
    release_nested();
    // A blank that the next console line begins with is no line of its own.
    if (m_console_line.find_first_not_of(' ') != std::string::npos)
        write_console("\n");
    if (m_options.to != nullptr)
        m_options.to->flush();
    if (m_options.trace_to != nullptr)
        m_options.trace_to->flush();
}

std::string folded(const std::string& line, std::size_t indent)
{
    std::string lines;
    std::size_t begin = 0;
    std::size_t comma = 0; // behind the last one of this line
    bool quoted = false;
    for (std::size_t i = 0; i < line.size(); ++i)
    {
        if (line[i] == '"' && (i == 0 || line[i - 1] != '\\'))
            quoted = !quoted;
        const std::size_t column = i - begin + (begin == 0 ? 0 : indent);
        if (column >= columns && comma > begin)
        {
            lines += line.substr(begin, comma - begin) + '\n' + std::string(indent, ' ');
            begin = comma + 1;
        }
        if (!quoted && line[i] == ',')
            comma = i + 1;
    }
    return lines + line.substr(begin);
}

std::string item_step(std::size_t index)
{
    return std::string("[").append(std::to_string(index)).append("]");
}

std::string to_json(const Outcome& outcome)
{
    const std::string result = outcome.result ? "\"result\":" + outcome.result->to_json() : std::string();
    std::string outputs;
    for (const OutputValue& output : outcome.outputs)
    {
        outputs += (outputs.empty() ? "" : ",") + board::Value::text(output.name).to_json() + ":" +
                   (output.value ? output.value->to_json() : "\"untouched\"");
    }
    return "{" + result + (result.empty() || outputs.empty() ? "" : ",") +
           (outputs.empty() ? "" : "\"outputs\":{" + outputs + "}") + "}";
}

std::string tree(const board::Value& value, std::size_t indent)
{
    std::string text;
    const bool is_list = value.kind() == board::Value::Kind::List;
    for (std::size_t i = 0; i < value.items().size(); ++i)
    {
        const board::Value& member = value.items()[i];
        const std::string head = std::string(indent, ' ') + (is_list ? item_step(i) : value.keys()[i]);
        const std::string line = head + " = " + member.to_text();
        if (member.items().empty() || line.size() <= columns)
            text += line + "\n";
        else
            text += head + "\n" + tree(member, indent + 2);
    }
    return text;
}

} // namespace pmxboard
