// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any text is a scenario: it runs to its end or to a line that is told, with its trace in each of the forms.
#include <cstddef>
#include <cstdint>
#include <sstream>

#include "fuzz/support/holds.h"
#include "fuzz/support/scenario.h"

namespace
{

void run_traced(const std::string& lines, const pmxboard::TraceForm& form)
{
    std::ostringstream trace;
    const auto sink = form.make({ .verbose = true, .colour = false, .apart = true }, trace);
    fuzz::run(lines, { .verbose = true, .trace = sink.get(), .trace_to = &trace, .stores = true });
    const bool is_lines = sink->has_lines();
    if (!sink->is_for_programs())
        fuzz::must_be_fit(trace.str());
    else if (is_lines)
        fuzz::must_be_json_lines(trace.str());
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const auto forms = pmxboard::trace_forms();
    const std::string lines = fuzz::harmless({ reinterpret_cast<const char*>(data), size });
    run_traced(lines, forms[size % forms.size()]);
    if (size % 4 == 0)
        fuzz::must(fuzz::run(lines).people == fuzz::run(lines).people, "power-on makes everything as good as new");
    return 0;
}
