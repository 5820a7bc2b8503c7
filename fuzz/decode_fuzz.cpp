// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a log: libFuzzer looks for some that are not.
#include <cstddef>
#include <cstdint>
#include <sstream>

#include "tools/pmxboard/decode/show.h"
#include "tools/record_view/mode_table.h"

// The layer is not linked here: nothing hangs on the capability word.
std::vector<record_view::ModeRow> record_view::mode_rows()
{
    return {};
}

std::map<unsigned, std::string> record_view::capability_features()
{
    return {};
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using namespace pmxboard::decode;
    const Log log = read_log({ reinterpret_cast<const char*>(data), size });
    const Story story = tell(log);
    ShowOptions options;
    options.verbose = true;
    options.name = "fuzz";
    std::ostringstream out;
    show_log(out, log, story, options);
    show_json(out, log, story, {}, options.name);
    return 0;
}
