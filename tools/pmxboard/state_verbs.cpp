// Verbs that look at what board and layer hold: state, save, diff.
#include <cerrno>
#include <cstring>
#include <fstream>

#include "board/board.h"
#include "tools/pmxboard/diff.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/state_dump.h"
#include "tools/pmxboard/state_paths.h"
#include "tools/pmxboard/step_error.h"
#include "tools/pmxboard/verb_words.h"

namespace pmxboard
{
namespace
{

using board::Value;

struct Wanted
{
    std::vector<std::string> paths;
    bool json = false;
};

/** `VERB [PATH…] [--json]` */
Wanted read_wanted(const Line& line)
{
    Wanted wanted;
    for (std::size_t i = 1; i < line.size(); ++i)
    {
        if (line.word(i) == "--json")
            wanted.json = true;
        else if (line.word(i).starts_with('-'))
            wrong_usage(line);
        else
            wanted.paths.push_back(line.word(i));
    }
    return wanted;
}

StateDump dump_of_now()
{
    return { board::description().name, whole_state() };
}

std::string line_for_programs(const NamedValues& values)
{
    std::string lines;
    for (const auto& [path, value] : values)
    {
        lines += lines.empty() ? "" : "\n";
        lines += R"({"kind":"state","version":)" + std::to_string(state_schema_version) + R"(,"path":)" +
                 Value::text(path).to_json() + R"(,"value":)" + value.to_json() + "}";
    }
    return lines;
}

} // namespace

void run_state(Session& session, const Line& line)
{
    const Wanted wanted = read_wanted(line);
    NamedValues values;
    for (const std::string& path : wanted.paths)
        values.emplace_back(path, state_at(path));
    if (wanted.paths.empty())
        values.emplace_back("", whole_state());
    const std::string json = wanted.paths.empty() ? to_json(dump_of_now()) : to_json(dump_of_now().board, values);
    session.output().shown(line_for_programs(values), wanted.json ? json + "\n" : to_text(values));
}

void run_save(Session& session, const Line& line)
{
    need_words(line, 2, 2);
    if (session.imagines())
        throw LineError("save writes a file, and what-if changes nothing");
    const std::string& name = line.word(1);
    errno = 0;
    std::ofstream file(name, std::ios::binary);
    file << to_json(dump_of_now()) << '\n';
    if (!file.flush())
        throw StepFailed("cannot write " + name + (errno != 0 ? std::string(": ") + std::strerror(errno) : ""));
    session.output().text("  saved to " + name + "\n");
}

void run_diff(Session& session, const Line& line)
{
    const Wanted wanted = read_wanted(line);
    for (const std::string& path : wanted.paths)
        state_at(path);
    const std::vector<Change> found = changes_at(session.changes(), wanted.paths);
    const std::string for_people = found.empty() ? "  nothing changed\n" : to_text(found);
    session.output().shown(R"({"kind":"diff","command":)" + Value::text(session.last_command()).to_json() +
                               R"(,"changes":)" + to_json_list(found) + "}",
                           wanted.json ? to_json(found) + "\n" : for_people);
}

} // namespace pmxboard
