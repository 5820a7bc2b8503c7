// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a log: libFuzzer looks for some that are not.
#include <cstddef>
#include <cstdint>
#include <sstream>

#include "fuzz/support/holds.h"
#include "tools/pmxboard/decode/show.h"
#include "tools/pmxboard/decode/to_scenario.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using namespace pmxboard::decode;
    const Log log = read_log({ reinterpret_cast<const char*>(data), size });
    const Story story = tell(log);
    ShowOptions options;
    options.verbose = true;
    options.name = "fuzz";
    std::ostringstream people;
    show_log(people, log, story, options);
    fuzz::must_be_fit(people.str());
    std::ostringstream programs;
    show_json(programs, log, story, {}, options.name);
    fuzz::must_be_json(programs.str());
    std::ostringstream scenario;
    write_scenario(scenario, log, options.name);
    fuzz::must_be_fit(scenario.str());
    return 0;
}
