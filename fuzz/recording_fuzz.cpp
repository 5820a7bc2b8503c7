// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a recording: what can be read is shown, read as steps, and replayed, twice.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <sstream>

#include "fuzz/support/holds.h"
#include "tools/pmxboard/commands/play_steps.h"
#include "tools/pmxboard/recording/replay.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using namespace pmxboard;
    try
    {
        const Recording recording = read_recording({ reinterpret_cast<const char*>(data), size });
        for (const EventForm form : { EventForm::Text, EventForm::Json, EventForm::Chrome })
        {
            std::ostringstream shown;
            show_events(shown, recording, {}, form);
        }
        if (recorded_steps(recording).steps.size() > 2 * recording.events.size())
            std::abort(); // each event begins and ends at most
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
