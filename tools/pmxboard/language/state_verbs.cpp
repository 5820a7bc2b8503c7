// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Verbs for what board and layer hold.
#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/kind.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/state/diff.h"
#include "tools/pmxboard/state/dump.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/pmxboard/state/status.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

using board::Value;

StateDump dump_of_now(const Session& session)
{
    return { board::description().name, whole_state(), session.steps() };
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

void show_state(Session& session, const Words& words)
{
    const std::vector<std::string> paths = words.all("PATH");
    NamedValues values;
    for (const std::string& path : paths)
        values.emplace_back(path, state_at(path));
    if (paths.empty())
        values.emplace_back("", whole_state());
    const std::string json = paths.empty() ? to_json(dump_of_now(session)) : to_json(board::description().name, values);
    session.output().shown(line_for_programs(values), words.has("--json") ? json + "\n" : to_text(values));
}

void show_status(Session& session, const Words& words)
{
    const Status status = status_of(whole_state(), board::description().name);
    const StatusPart part = words.has("outputs")    ? StatusPart::Outputs
                            : words.has("planes")   ? StatusPart::Planes
                            : words.has("graphics") ? StatusPart::Graphics
                                                    : StatusPart::All;
    session.output().shown(to_json_line(status), words.has("--json") ? to_json(status) + "\n"
                                                                     : to_text(status, part, session.output().look()));
}

void show_changes(Session& session, const Words& words)
{
    const std::vector<std::string> paths = words.all("PATH");
    for (const std::string& path : paths)
        state_at(path);
    const std::vector<Change> found = changes_at(session.changes(), paths);
    const std::string for_people = found.empty() ? "  nothing changed\n" : to_text(found);
    session.output().shown(R"({"kind":"diff","command":)" + Value::text(session.last_command()).to_json() +
                               R"(,"changes":)" + to_json_list(found) + "}",
                           words.has("--json") ? to_json(found) + "\n" : for_people);
}

void save(Session& session, const Words& words)
{
    if (session.imagines())
        throw LineError("save writes a file, and what-if changes nothing");
    const std::string name = file_name(words.at("FILE"));
    try
    {
        write_file(name, to_json(dump_of_now(session)) + "\n");
    }
    catch (const board::files::FileError& error)
    {
        throw StepFailed(error.what());
    }
    session.output().text("  saved to " + printable(name) + "\n");
    if (const std::string& lost = session.steps().lost(); !lost.empty())
        session.output().text(wrapped("  to be looked at and compared, not restored: " + lost, usual_width, 0, 2));
}

void restore(Session& session, const Words& words)
{
    const std::string name = file_name(words.at("FILE"));
    StateDump dump;
    try
    {
        dump = read_dump(board::files::read_once(name, largest_state));
    }
    catch (const board::files::FileError& error)
    {
        throw StepFailed(error.what());
    }
    catch (const DumpError& error)
    {
        throw StepFailed(name + ": " + error.what());
    }
    session.restore(dump, name);
    session.output().text("  restored from " + printable(name) + "\n");
}

void poke(Session&, const Words& words)
{
    try
    {
        const board::trace::By scope(Session::is_meanwhile() ? "meanwhile" : "poke");
        const record_view::FieldType field = record_view::type_of(words.at("FIELD"));
        const auto family = board::names::family_of(field.record, field.member);
        record_view::set(words.at("FIELD"), read_number(family, words.at("VALUE"), field.path));
    }
    catch (const record_view::FieldError& error)
    {
        throw LineError(error.what());
    }
}

} // namespace

std::vector<Verb> state_verbs()
{
    return {
        { "status",
          { { "status [outputs|planes|graphics] [--json]",
              "show what each output shows, what each plane is fed with, whether graphics are held back and until "
              "when, "
              "and where record and hardware disagree; or one of these",
              show_status, looks } } },
        { "state",
          { { "state [PATH…] [--json]", "show what board and layer hold, or parts of it", show_state, looks } } },
        { "diff",
          { { "diff [PATH…] [--json]", "show what the last command changed, of everything or at these paths",
              show_changes, looks } } },
        { "save",
          { { "save FILE", "write the whole state to a file, relative to where the tool runs", save, looks } } },
        { "restore",
          { { "restore FILE",
              "bring board and layer to a saved state, by the commands that led there; the file is named relative to "
              "where the tool runs",
              restore } } },
        { "poke", { { "poke FIELD VALUE", "change the layer's record, for what no operation can set", poke } } },
    };
}

} // namespace pmxboard
