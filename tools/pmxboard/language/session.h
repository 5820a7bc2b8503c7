// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A scenario that runs: it carries lines out, one after the other, and remembers what expectations look at. */
#pragma once

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <iosfwd>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "board/trace.h"
#include "board/value.h"
#include "tools/pmxboard/functions/operation.h"
#include "tools/pmxboard/language/explanation.h"
#include "tools/pmxboard/language/line.h"
#include "tools/pmxboard/state/diff.h"
#include "tools/pmxboard/state/dump.h"
#include "tools/pmxboard/state/steps.h"
#include "tools/pmxboard/view/output.h"

namespace pmxboard
{

class Session
{
public:
    /** @param board      what `power-on` without a name takes
     *  @param directory  what file names in the scenario are relative to */
    Session(Output& output, std::string board, std::filesystem::path directory);
    ~Session();
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    /** Carry out one line. Throws LineError or StepFailed. */
    void run_line(std::string_view text);
    /** Carry out the lines of another file; names of files in it are relative to it. Throws LineError or StepFailed
     *  with the file and the line in front. */
    void include(const std::string& name);
    /** The scenario ends. Throws StepFailed when the board found a misuse that no line expected. */
    void finish();

    unsigned expectations() const { return m_expectations; }
    /** Whether the board is this session's: until then it holds what another one has left. */
    bool is_powered() const { return m_powered; }

    /** Whether the state is kept before each command, for `diff`. It is, unless a scenario that never asks for the
     *  differences turns it off. */
    void watch_changes(bool on) { m_watches = on; }

    /* For verbs */

    Output& output() { return m_output; }
    /** A file named in the scenario, in double quotes where its name has blanks. Throws LineError. */
    std::filesystem::path file(const std::string& name) const;
    /** Power the board on; an empty name takes the session's own board. */
    void power_on(const std::string& board);
    /** Call an operation and remember its outcome. */
    void run(const Operation& operation, const Values& values);
    /** Remember a result that a verb has. */
    void set_outcome(std::string operation, Outcome outcome);
    /** What the command does from here on, or did until here, is what expectations look at. */
    void begin_window();
    void end_window();
    /** What is done by others from here on is looked at as well, behind what the last command did. */
    void open_window();

    /** Have stores in the trace from now on, where expectations see them; or no more. */
    void watch_stores(bool on);
    bool watches_stores() const { return m_watches_stores; }
    /** Carry a command out from inside a platform call: what it does is the running command's, its outcome a notice. */
    void run_meanwhile(const Line& line);
    /** The same at a breakpoint: verbs that look show what they see in the middle of the call. */
    void run_stopped(const Line& line);
    /** Whether such a command is running. */
    static bool is_meanwhile();

    /** What the last command changed that did not only look. */
    std::vector<Change> changes() const;
    const std::string& last_command() const { return m_last_command; }
    /** Carry a line out in a process that is about to end: its effects are nobody's. */
    void imagine(std::string_view text, std::ostream& shown);
    /** Whether nothing outside may come of what is done: it is imagined, or done once more for its explanation. */
    bool imagines() const { return m_imagined != 0 || m_explained_alone; }
    void forget_outcome();

    /** Whether each command is explained before it is carried out, for `why`; and whether what was refused is shown
     *  without asking. That takes a copy of the process for each. */
    void explain_commands(bool on, bool shown = false)
    {
        m_explains = on;
        m_shows_explanations = shown;
    }
    /** The same for one command alone, counted from 1. */
    void explain_command(std::size_t number)
    {
        m_explains = true;
        m_explained_alone = number;
    }
    /** How many commands have run that did not only look. */
    std::size_t commands() const { return m_commands; }
    /** Of the last command that did not only look; nothing when none was explained. */
    const std::optional<Explanation>& explanation() const { return m_explanation; }

    /** The commands that led here, as a saved state keeps them. */
    const Steps& steps() const { return m_steps; }
    /** Something happened that none of its commands says: the state cannot be restored. */
    void lose_steps(std::string why) { m_steps.lose(std::move(why)); }
    /** Others call the layer and the platform, too: what they do between two commands is noticed. */
    void notice_others();
    /** Bring board and layer to a saved state by what led there; `name` is the file's, for messages. When they do not
     *  lead there, nothing has changed. Throws StepFailed. */
    void restore(const StateDump& dump, const std::string& name);
    bool is_restoring() const { return m_restoring; }

    /* For expectations */

    const std::string& last_operation() const { return m_last_operation; }
    const Outcome& last_outcome() const { return m_last_outcome; }
    /** What the last command left in the trace, and how much of it expectations have gone through. */
    std::vector<board::TraceEntry> window() const;
    std::size_t cursor() const { return m_cursor; }
    void set_cursor(std::size_t cursor) { m_cursor = cursor; }
    /** What the last command printed on the console. */
    std::string console_window() const;
    /** When the last command began, since power-on. */
    std::chrono::microseconds begun() const { return m_begun; }
    void expect_misuses(unsigned count) { m_misuses_expected = count; }

private:
    void run_command(const Line& line);
    void carry_out(const Line& line);
    void check_meanwhiles() const;
    void run_file(const std::string& path, const std::string& name);
    /** A scenario that does not begin with power-on has a board all the same. */
    void need_power(std::string_view command);
    void run_step(const Step& step);
    void run_steps(const StateDump& dump, const std::string& name);
    void keep_step(const Line& line, bool failed = false);
    void check_misuses() const;
    void remember(const Line& line);
    static bool leads_into_layer(const Line& line);
    void explain_ahead(const Line& line);
    static void forget_the_past();
    void look_for_others();
    void take_state();

    Output& m_output;
    std::string m_board;
    std::filesystem::path m_directory;
    bool m_powered = false;
    unsigned m_expectations = 0;
    unsigned m_misuses_expected = 0;
    std::string m_last_misuse;
    bool m_watches = true;
    Steps m_steps;
    bool m_restoring = false;
    bool m_notices_others = false;
    unsigned m_running = 0;             ///< commands, each within the one before
    std::optional<board::Value> m_left; ///< the state that the last command left, when others are noticed
    unsigned m_imagined = 0;            ///< what-if within what-if
    bool m_watches_stores = false;
    bool m_explains = false;
    bool m_shows_explanations = false;
    std::optional<std::size_t> m_explained_alone;
    std::size_t m_commands = 0;
    std::optional<Explanation> m_explanation;
    std::string m_last_command;
    std::optional<board::Value> m_before; ///< the state that the last command found; not for power-on
    std::string m_last_operation;
    Outcome m_last_outcome;
    std::size_t m_window_begin = 0;
    std::size_t m_window_end = 0;
    std::size_t m_cursor = 0;
    std::chrono::microseconds m_begun{};
    unsigned m_includes = 0;                       ///< since the outermost of them began
    std::vector<std::filesystem::path> m_included; ///< the files that are being carried out, each within the one before
    std::size_t m_console_begin = 0;
    std::size_t m_console_end = 0;
};

/** A file's name as a scenario writes it: with blanks it stands in double quotes. Throws LineError. */
std::string file_name(const std::string& word);
/** The other way round. */
std::string word_of_file(const std::string& name);

/** `expect …`. Throws StepFailed when it is not met. */
void check_expectation(Session& session, const Line& line);

} // namespace pmxboard
