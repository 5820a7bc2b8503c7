// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a saved state, or two with a zero between them: looked at, compared and written anew.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include "board/board.h"
#include "fuzz/support/holds.h"
#include "fuzz/support/place.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/state/diff.h"
#include "tools/pmxboard/state/dump.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/pmxboard/state/status.h"

namespace
{

using namespace pmxboard;

std::optional<StateDump> read(std::string_view bytes)
try
{
    return read_dump(bytes);
}
catch (const DumpError&)
{
    return {};
}

void tell_status(const StateDump& dump)
{
    const Status status = status_of(dump.state, dump.board);
    for (const StatusPart part : { StatusPart::All, StatusPart::Outputs, StatusPart::Planes, StatusPart::Graphics })
        fuzz::must_be_fit(to_text(status, part, {}));
    fuzz::must_be_json(to_json(status));
    fuzz::must_be_json(to_json_line(status));
}

void look_at(const StateDump& dump)
{
    tell_status(dump);
    fuzz::must_be_fit(to_text(NamedValues{ { "", dump.state } }));
    const std::string written = to_json(dump);
    const std::optional<StateDump> again = read(written);
    fuzz::must(again && again->board == dump.board, "a state that was written can be read");
    fuzz::must(changes(dump.state, again->state).empty(), "a state that was written is what it was");
    fuzz::must(to_json(*again) == written, "a state is written in one way");
}

void compare(const StateDump& older, const StateDump& newer)
{
    const std::vector<Change> all = changes(older.state, newer.state);
    fuzz::must(all.empty() == (older.state == newer.state), "states differ where their values do");
    fuzz::must(changes(newer.state, older.state).size() == all.size(), "differences are the same from both sides");
    fuzz::must_be_fit(to_text(all));
    fuzz::must_be_json(to_json(all));
    for (std::size_t i = 0; i < std::min<std::size_t>(all.size(), 4); ++i)
        fuzz::must(!changes_at(all, { all[i].path }).empty(), "a difference is found by its path");
}

const StateDump& state_at_start()
{
    static const StateDump dump = [] {
        fuzz::power_on();
        return StateDump{ board::description().name, whole_state() };
    }();
    return dump;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    const std::size_t end = std::min(bytes.find('\0'), size);
    const std::optional<StateDump> one = read(bytes.substr(0, end));
    if (!one)
        return 0;
    look_at(*one);
    const std::optional<StateDump> other = end < size ? read(bytes.substr(end + 1)) : std::nullopt;
    compare(*one, other ? *other : state_at_start());
    return 0;
}
