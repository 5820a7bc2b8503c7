// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/shell.h"

#include <unistd.h>

#include <cstdlib>
#include <exception>
#include <iostream>
#include <memory>
#include <set>

#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/graphics/drawing.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/prompt/completion.h"
#include "tools/pmxboard/prompt/editor.h"
#include "tools/pmxboard/prompt/help.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/pmxboard/view/output.h"

namespace pmxboard
{
namespace
{

const std::vector<std::string> shell_words = { "help", "break", "record", "quit", "exit" };

/** The lines of one shell, carried out one after the other. */
class Shell
{
public:
    Shell(const ShellOptions& options, LineSource& lines, bool interactive)
        : m_lines(lines), m_interactive(interactive), m_output(output_options(options, lines, interactive)),
          m_session(m_output, options.board.empty() ? "default" : options.board, "."), m_look{
              text_width(), wants_colour(options.colour)
          }
    {
        m_session.explain_commands(true);
    }

    ~Shell() { board::at_every_call({}); }
    Shell(const Shell&) = delete;
    Shell& operator=(const Shell&) = delete;

    /** Before the first line: completion looks into the board. */
    void power_on() { m_session.power_on({}); }

    /** Carry a line out; false when it ends the shell. Throws FileError when the lines behind it, read while the layer
     *  was stopped, cannot be read on. */
    bool run(const std::string& text)
    {
        ++m_number;
        set_place("<stdin>:" + std::to_string(m_number));
        try
        {
            const Line line(text);
            if (line.empty())
                return true;
            if (line.word(0) == "quit" || line.word(0) == "exit")
            {
                if (line.size() != 1)
                    throw LineError("write: " + line.word(0));
                return false;
            }
            carry_out(line, text);
        }
        catch (const std::exception& error)
        {
            report(error.what());
        }
        if (m_unreadable)
            std::rethrow_exception(m_unreadable);
        return true;
    }

    /** The end of all lines, or of those that can be read; the exit code. */
    int finish()
    {
        // The record first: it holds what led to what is wrong at the end.
        const bool is_kept = hold([this] { end_record(); });
        const bool is_right = hold([this] { m_session.finish(); });
        return is_kept && is_right && (!m_failed || m_interactive) ? exit_done : exit_failed;
    }

private:
    /** Do something, or tell why not. */
    template <typename Step>
    bool hold(const Step& step)
    try
    {
        step();
        return true;
    }
    catch (const std::exception& error)
    {
        report(error.what());
        return false;
    }

    static OutputOptions output_options(const ShellOptions& shell, LineSource& lines, bool interactive)
    {
        OutputOptions output;
        output.quiet = shell.quiet;
        output.verbose = shell.verbose;
        output.colour = wants_colour(shell.colour);
        output.echo = !interactive;
        output.to = &std::cout;
        output.filter = { shell.only, shell.operations };
        GiveBack give_back;
        if (interactive && has_editor())
            give_back = [&lines](const std::string& keys) { lines.take_back(keys); };
        output.draw = drawing(shell.graphics, output.colour, give_back);
        return output;
    }

    void carry_out(const Line& line, const std::string& text)
    {
        const std::string& word = line.word(0);
        if (word == "help")
            help(line);
        else if (word == "break")
            set_break(line);
        else if (word == "record")
            record(line);
        else
        {
            run_line(line, text);
            keep(line);
        }
    }

    void run_line(const Line& line, const std::string& text)
    try
    {
        m_session.run_line(text);
    }
    catch (const StepFailed& failure)
    {
        const auto& explanation = m_session.explanation();
        if (line.word(0) != "expect" || !explanation || explanation->reasons.empty())
            throw;
        report(failure.what());
        m_output.text(to_text(*explanation, m_look));
    }

    /* Breakpoints: the layer stops at the end of a platform call, when the device has acted. */

    void set_break(const Line& line)
    {
        if (line.size() > 2)
            throw LineError("write: break FUNCTION, break off, or break");
        if (line.size() == 1)
        {
            for (const std::string& function : m_breaks)
                m_output.text("  " + function + "\n");
            return;
        }
        if (line.word(1) == "off")
            m_breaks.clear();
        else
        {
            need_platform_function(line.word(1));
            m_breaks.insert(line.word(1));
        }
        watch_calls();
    }

    /** Through every power-on, until there is nothing to stop at. */
    void watch_calls()
    {
        if (m_breaks.empty())
            board::at_every_call({});
        else
            board::at_every_call([this](const board::TraceEntry& entry) { stop_at(entry); });
    }

    void stop_at(const board::TraceEntry& entry)
    {
        if (!m_breaks.contains(entry.function) || m_session.imagines() || m_session.is_restoring() || m_unreadable)
            return;
        m_output.flush(); // what led here
        std::cout << "stopped in " << printable_lines(entry.brief()) << "; continue goes on\n";
        while (const std::optional<std::string> text = read_stopped())
        {
            ++m_number;
            if (!run_stopped(*text))
                return;
        }
    }

    /** The next line; none where none can be read, which is told when the layer is through. */
    std::optional<std::string> read_stopped()
    try
    {
        return m_lines.read();
    }
    catch (const board::files::FileError&)
    {
        m_unreadable = std::current_exception();
        return std::nullopt;
    }

    /** A line while the layer is stopped; false when it goes on. Nothing that is thrown may reach the layer. */
    bool run_stopped(const std::string& text)
    {
        try
        {
            const Line line(text);
            if (line.empty())
                return true;
            if (line.word(0) == "continue")
                return false;
            if (line.word(0) == "help")
                help(line);
            else if (line.word(0) == "break")
                set_break(line);
            else
                m_session.run_stopped(line);
        }
        catch (const std::exception& error)
        {
            report(error.what());
        }
        return true;
    }

    /* What was typed, as a scenario. */

    void record(const Line& line)
    {
        if (line.size() != 2)
            throw LineError("write: record FILE, or record off");
        end_record();
        if (line.word(1) != "off")
            m_record = std::make_unique<NewFile>(file_name(line.word(1)), NewFile::Over::OutputsAlone,
                                                 NewFile::Unfinished::Kept);
    }

    void end_record()
    {
        if (const auto record = std::move(m_record))
            record->commit();
    }

    /** A line that was carried out, and what an operation answered. */
    void keep(const Line& line)
    {
        if (!m_record)
            return;
        m_record->stream() << line.from(0) << '\n';
        const auto& result = m_session.last_outcome().result;
        if (find(operations(), line.word(0)) != nullptr && result)
            m_record->stream() << "expect result " << result->to_text() << '\n';
    }

    void help(const Line& line)
    {
        m_output.flush();
        if (line.size() == 1)
            std::cout << shell_help(m_look);
        for (std::size_t i = 1; i < line.size(); ++i)
            std::cout << (i == 1 ? "" : "\n") << help_on(line.word(i), m_look);
    }

    void report(const char* message)
    {
        m_failed = true;
        m_output.flush();
        std::cout.flush();
        if (!m_interactive)
            std::cerr << "<stdin>:" << m_number << ": ";
        std::cerr << presentable(message) << '\n';
    }

    LineSource& m_lines;
    bool m_interactive;
    std::set<std::string> m_breaks; ///< functions of the platform
    std::unique_ptr<NewFile> m_record;
    Output m_output;
    Session m_session;
    Look m_look;
    unsigned m_number = 0;
    bool m_failed = false;
    std::exception_ptr m_unreadable; ///< why no line came while the layer was stopped
};

bool is_terminal()
{
    return isatty(STDIN_FILENO) == 1 && isatty(STDOUT_FILENO) == 1;
}

/** The history's place, made where it does not exist; empty when it cannot be, which is told. */
std::filesystem::path usable_history()
{
    const std::filesystem::path file = history_file();
    std::error_code error;
    if (file.has_parent_path())
        std::filesystem::create_directories(file.parent_path(), error);
    if (!error)
        return file;
    const std::string why = "cannot make " + file.parent_path().string() + ": " + error.message();
    std::cerr << "pmxboard: no history is kept: " << printable(why, longest_message) << '\n';
    return {};
}

void greet(const std::string& board)
{
    std::cout << "The mixer layer on board " << (board.empty() ? "default" : board)
              << ". Tab completes, help tells more, Ctrl-D ends.\n";
}

} // namespace

std::filesystem::path history_file()
{
    if (const char* const chosen = std::getenv("PMXBOARD_HISTORY"))
        return chosen;
    const char* const state = std::getenv("XDG_STATE_HOME");
    if (state != nullptr && *state == '/')
        return std::filesystem::path(state) / "pmxboard" / "history";
    const char* const home = std::getenv("HOME");
    if (home == nullptr || *home != '/')
        return {};
    return std::filesystem::path(home) / ".local" / "state" / "pmxboard" / "history";
}

int run_shell(const ShellOptions& options)
{
    try
    {
        board::load_description(options.board.empty() ? "default" : options.board);
    }
    catch (const board::DescriptionError& error)
    {
        return usage_error(error.what());
    }
    if (const std::string wrong = TraceFilter{ options.only, options.operations }.complaint(); !wrong.empty())
        return usage_error(wrong);
    const bool interactive = is_terminal();
    const auto complete_here = [](std::string_view line, std::size_t cursor) {
        return complete(line, cursor, { ".", shell_words });
    };
    const auto lines = interactive ? make_editor({ "pmx> ", usable_history(), complete_here }) : make_plain_source();
    Shell shell(options, *lines, interactive);
    shell.power_on();
    if (interactive)
        greet(options.board);
    try
    {
        std::optional<std::string> line;
        bool goes_on = true;
        while (goes_on && (line = lines->read()))
        {
            if (line->find_first_not_of(" \t\r") != line->npos)
                lines->remember(*line);
            goes_on = shell.run(*line);
        }
    }
    catch (const board::files::FileError& error)
    {
        const int code = usage_error(error.what());
        shell.finish();
        return code;
    }
    return shell.finish();
}

int print_completions(const std::string& line, std::ostream& to)
{
    for (const std::string& candidate : complete(line, line.size(), { ".", shell_words }).candidates)
        to << candidate << '\n';
    return exit_done;
}

} // namespace pmxboard
