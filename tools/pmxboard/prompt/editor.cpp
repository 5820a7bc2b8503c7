// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The one place of the tool that knows the line editor's library.
#include "tools/pmxboard/prompt/editor.h"

#include <iostream>
#include <istream>

#include "board/files.h"

#ifdef PMX_HAS_LIBEDIT
#include <histedit.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cwchar>

#include "tools/pmxboard/prompt/help.h"
#include "tools/pmxboard/prompt/history_file.h"
#include "tools/pmxboard/text/layout.h"
#endif

namespace pmxboard
{
namespace
{

class PlainSource : public LineSource
{
public:
    explicit PlainSource(std::string prompt) : m_prompt(std::move(prompt)) {}

    std::optional<std::string> read() override
    {
        if (!m_prompt.empty())
            std::cout << m_prompt << std::flush;
        std::string line;
        if (!board::files::next_line(*m_lines, line))
            return std::nullopt;
        return line;
    }

private:
    std::string m_prompt;
    std::unique_ptr<std::istream> m_lines = board::files::open_lines("-");
};

#ifdef PMX_HAS_LIBEDIT

constexpr int kept_lines = 1000;

/** Whether the editor can show a line: one that is no text of the user's language hides all that are older. */
bool is_shown(const std::string& line)
{
    return std::mbstowcs(nullptr, line.c_str(), 0) != static_cast<std::size_t>(-1);
}

/** Keys without those that are no text of the user's language, and without zeroes: the editor would take none. */
std::string only_text(std::string_view keys)
{
    std::string text;
    std::mbstate_t state{};
    while (!keys.empty())
    {
        const std::size_t length = std::mbrtowc(nullptr, keys.data(), keys.size(), &state);
        const bool is_text = length != 0 && length <= keys.size();
        if (is_text)
            text += keys.substr(0, length);
        else
            state = {};
        keys.remove_prefix(is_text ? length : 1);
    }
    return text;
}

class Editor : public LineSource
{
public:
    explicit Editor(EditorOptions options) : m_options(std::move(options)), m_kept(m_options.history, kept_lines)
    {
        HistEvent event{};
        m_history = history_init();
        history(m_history, &event, H_SETSIZE, kept_lines);
        history(m_history, &event, H_SETUNIQUE, 1);
        for (const std::string& line : m_kept.lines())
        {
            if (is_shown(line))
                history(m_history, &event, H_ENTER, line.c_str());
        }

        m_editor = el_init("pmxboard", stdin, stdout, stderr);
        el_set(m_editor, EL_CLIENTDATA, this);
        el_set(m_editor, EL_PROMPT, &Editor::prompt);
        el_set(m_editor, EL_EDITOR, "emacs");
        el_set(m_editor, EL_HIST, history, m_history);
        // The names stay with the editor; its narrow form would clone them for good.
        el_wset(m_editor, EL_ADDFN, L"pmx-complete", L"complete the word", &Editor::on_complete);
        el_set(m_editor, EL_BIND, "^I", "pmx-complete", nullptr);
        el_set(m_editor, EL_BIND, "^R", "em-inc-search-prev", nullptr);
        el_wset(m_editor, EL_ADDFN, L"pmx-drop-line", L"drop the line", &Editor::on_drop);
        el_set(m_editor, EL_BIND, "^C", "pmx-drop-line", nullptr);
        // A terminal that was asked for its pictures, and is slower than anybody waits, answers all the same.
        el_wset(m_editor, EL_ADDFN, L"pmx-drop-report", L"drop what the terminal reports", &Editor::on_report);
        el_set(m_editor, EL_BIND, "^[[?", "pmx-drop-report", nullptr);
        el_set(m_editor, EL_BIND, "^[_G", "pmx-drop-report", nullptr);
        // While a line is edited Ctrl-C is a key like any other; while a command runs it ends the tool as ever.
        el_set(m_editor, EL_SETTY, "-d", "-isig", nullptr);
        el_set(m_editor, EL_SIGNAL, 1);
        el_source(m_editor, nullptr);
    }

    ~Editor() override
    {
        el_end(m_editor);
        history_end(m_history);
    }

    std::optional<std::string> read() override
    {
        std::cout.flush();
        int count = 0;
        const char* text = nullptr;
        do
        {
            m_dropped = false;
            text = el_gets(m_editor, &count);
        }
        while (m_dropped);
        if (text == nullptr || count <= 0)
        {
            std::cout << '\n';
            return std::nullopt;
        }
        std::string line(text, static_cast<std::size_t>(count));
        if (line.ends_with('\n'))
            line.pop_back();
        return line;
    }

    void take_back(const std::string& keys) override { el_push(m_editor, only_text(keys).c_str()); }

    void remember(const std::string& line) override
    {
        HistEvent event{};
        history(m_history, &event, H_ENTER, line.c_str());
        // At once: a shell that is ended by a signal has its history, too.
        m_kept.add(line);
    }

private:
    static Editor& self(EditLine* editor)
    {
        void* data = nullptr;
        el_get(editor, EL_CLIENTDATA, &data);
        return *static_cast<Editor*>(data);
    }

    static char* prompt(EditLine* editor) { return self(editor).m_options.prompt.data(); }

    static unsigned char on_drop(EditLine* editor, int)
    {
        self(editor).m_dropped = true;
        std::fputs("^C\n", stdout);
        std::fflush(stdout);
        return CC_EOF;
    }

    /** Numbers up to a letter; or, of kitty's graphics, all up to an escape and a backslash. One that breaks off ends
     *  where a control character is typed. */
    static unsigned char on_report(EditLine* editor, int last_of_begin)
    {
        constexpr int longest = 1000;
        constexpr char escape = '\x1b';
        const bool is_kitty = last_of_begin == 'G';
        char key = 0;
        char before = 0;
        for (int count = 0; count < longest && el_getc(editor, &key) == 1; ++count, before = key)
        {
            const bool is_control = key >= 0 && key < ' ' && key != escape;
            if (is_control)
                el_push(editor, std::string(1, key).c_str());
            const bool is_number = (key >= '0' && key <= '9') || key == ';';
            if (is_control || (is_kitty ? before == escape : !is_number))
                break;
        }
        return CC_NORM;
    }

    /** The library that calls it is no C++. */
    static unsigned char on_complete(EditLine* editor, int)
    try
    {
        return self(editor).complete_word();
    }
    catch (const std::exception&)
    {
        return CC_REFRESH_BEEP;
    }

    unsigned char complete_word()
    {
        const LineInfo* const info = el_line(m_editor);
        const std::string line(info->buffer, static_cast<std::size_t>(info->lastchar - info->buffer));
        const auto cursor = static_cast<std::size_t>(info->cursor - info->buffer);
        const Completion completion = m_options.complete(line, cursor);
        if (completion.candidates.empty())
            return tell(completion.argument);

        const std::string written = line.substr(completion.begin, cursor - completion.begin);
        const std::string common = completion.common();
        // What was written in small letters is replaced as well.
        const bool is_replaced = common.size() >= written.size() && !common.starts_with(written);
        std::string insert = is_replaced ? common : common.substr(std::min(written.size(), common.size()));
        const bool single = completion.candidates.size() == 1;
        const bool at_blank = cursor < line.size() && line[cursor] == ' ';
        if (single && is_whole(completion.candidates[0]) && !at_blank)
            insert += ' ';
        if (is_replaced)
            el_deletestr(m_editor, static_cast<int>(columns_of(written)));
        if (!insert.empty())
            el_insertstr(m_editor, insert.c_str());
        if (single || !insert.empty())
            return CC_REFRESH;
        std::fputc('\n', stdout);
        if (!completion.argument.empty())
            std::fprintf(stdout, "%s\n", completion.argument.c_str());
        list(completion.candidates);
        return CC_REDISPLAY;
    }

    /** Where nothing can be completed, at least what is to be written there. */
    static unsigned char tell(const std::string& argument)
    {
        if (argument.empty())
            return CC_REFRESH_BEEP;
        std::fprintf(stdout, "\n%s\n", argument.c_str());
        std::fflush(stdout);
        return CC_REDISPLAY;
    }

    /** All candidates below the line; what does not fit the screen only when the user says so. */
    void list(const std::vector<std::string>& candidates)
    {
        winsize window{};
        const bool known = ioctl(STDOUT_FILENO, TIOCGWINSZ, &window) == 0 && window.ws_col != 0 && window.ws_row != 0;
        const std::string text = in_columns(candidates, known ? window.ws_col : 80u);
        const auto lines = std::count(text.begin(), text.end(), '\n');
        if (lines >= (known ? window.ws_row : 24))
        {
            std::fprintf(stdout, "%zu candidates; show them all? (y or n) ", candidates.size());
            std::fflush(stdout);
            char key = 0;
            const bool yes = el_getc(m_editor, &key) == 1 && (key == 'y' || key == 'Y');
            std::fputc('\n', stdout);
            if (!yes)
                return;
        }
        std::fputs(text.c_str(), stdout);
        std::fflush(stdout);
    }

    EditorOptions m_options;
    HistoryFile m_kept;
    History* m_history = nullptr;
    EditLine* m_editor = nullptr;
    bool m_dropped = false;
};

#endif

} // namespace

std::unique_ptr<LineSource> make_editor(const EditorOptions& options)
{
#ifdef PMX_HAS_LIBEDIT
    return std::make_unique<Editor>(options);
#else
    return std::make_unique<PlainSource>(options.prompt);
#endif
}

std::unique_ptr<LineSource> make_plain_source()
{
    return std::make_unique<PlainSource>(std::string());
}

bool has_editor()
{
#ifdef PMX_HAS_LIBEDIT
    return true;
#else
    return false;
#endif
}

} // namespace pmxboard
