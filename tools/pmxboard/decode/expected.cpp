// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>
#include <filesystem>

#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/decode/against.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/view/output.h"

namespace pmxboard::decode
{
namespace
{

/** A trace entry as the console shows it; nothing for what is not printed. */
std::optional<std::string> printed(const board::TraceEntry& entry)
{
    if (entry.kind == board::TraceEntry::Kind::Log)
        return entry.text;
    if (entry.kind != board::TraceEntry::Kind::Assert)
        return {};
    return "ASSERT " + entry.arguments[0].value.string() + ", " + entry.arguments[1].value.string() + ":" +
           entry.arguments[2].value.to_text();
}

/** What the lines of a scenario make the layer print. */
class Run
{
public:
    explicit Run(const std::string& board, const std::filesystem::path& directory)
        : m_output(OutputOptions{ .quiet = true }), m_session(m_output, board, directory)
    {
        board::trace::set_sink([this](const board::TraceEntry& entry) {
            if (printed(entry))
                m_entries.push_back(entry);
        });
    }

    void line(std::size_t number, const std::string& text)
    {
        m_entries.clear();
        m_session.run_line(text);
        std::sort(m_entries.begin(), m_entries.end(),
                  [](const auto& one, const auto& other) { return one.sequence < other.sequence; });
        for (const board::TraceEntry& entry : m_entries)
        {
            if (auto item = read_text(*printed(entry)))
                m_texts.push_back({ std::move(*item), entry.operation, number, text });
        }
    }

    std::vector<Expected> finish()
    {
        m_session.finish();
        return std::move(m_texts);
    }

private:
    Output m_output;
    Session m_session;
    std::vector<board::TraceEntry> m_entries;
    std::vector<Expected> m_texts;
};

} // namespace

std::vector<Expected> run_for_texts(const std::string& scenario, const std::string& board)
{
    const auto lines = board::files::open_lines(scenario);
    std::size_t number = 0;
    try
    {
        Run run(board.empty() ? "default" : board, std::filesystem::path(scenario).parent_path());
        for (std::string text; board::files::next_line(*lines, text);)
            run.line(++number, text);
        return run.finish();
    }
    catch (const board::files::FileError&)
    {
        throw;
    }
    catch (const std::exception& error)
    {
        throw ScenarioFailed(scenario + ":" + std::to_string(number) + ": " + error.what());
    }
}

} // namespace pmxboard::decode
