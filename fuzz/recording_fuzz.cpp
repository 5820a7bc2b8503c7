// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a recording: what can be read is replayed, twice.
#include <cstddef>
#include <cstdint>
#include <cstdlib>

#include "fuzz/support/holds.h"
#include "tools/pmxboard/recording/replay.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using namespace pmxboard;
    try
    {
        const Recording recording = read_recording({ reinterpret_cast<const char*>(data), size });
        const ReplayVerdict verdict = replay(recording);
        if (verdict.events > recording.events.size())
            std::abort(); // more than there is
        if (verdict.departure)
            fuzz::must_be_fit(verdict.departure->recorded + verdict.departure->computed + verdict.departure->record);
        if (replay(recording).departure.has_value() != verdict.departure.has_value())
            std::abort(); // it is the same layer
    }
    catch (const RecordingError&)
    {
        return 0;
    }
    return 0;
}
