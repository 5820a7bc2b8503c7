// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Per-output mode setting, all combinations: against the rule said a second time. */
#include "board/hdmi_av.h"
#include "board/video_planes.h"
#include "tests/layer/mode_ex.h"
#include "tests/layer/mode_ex_rule.h"

using namespace mode_ex;

namespace
{

const char* const entry_fields[] = { "arOutputConf[0].", "arOutputConf[1].", "arOutputConf[2].", "arOutputConf[3]." };

/** Make the layer remember this instead of that. */
void remember(const Memory& memory, const Memory& instead_of)
{
    const auto set = [](const std::string& field, unsigned number, unsigned before) {
        if (number != before)
            LayerTest::set_record(field, number);
    };
    for (unsigned output = 0; output < 4; ++output)
    {
        const std::string entry = entry_fields[output];
        set(entry + "fgOutputEnable", memory.last.outputs[output].on, instead_of.last.outputs[output].on);
        set(entry + "eResMode", memory.last.outputs[output].mode, instead_of.last.outputs[output].mode);
    }
    set("ucVfreq", memory.last.frequency, instead_of.last.frequency);
    set("rDrvExtScl", memory.last.chip, instead_of.last.chip);
    set("fgOSD5", memory.last.osd5, instead_of.last.osd5);
    set("ucMode", memory.format, instead_of.format);
    set("ucTvType", memory.tv_type, instead_of.tv_type);
    set("fgSetModeCalled", memory.set_before, instead_of.set_before);
    set("_fgBootUp", memory.first_after_load, instead_of.first_after_load);
    set("status.fgPmxFormatChangeFlag", memory.format_change, instead_of.format_change);
    set("status.fgPmxEnabeOsdFlag", memory.osd_owed, instead_of.osd_owed);
    set("status.fgTimerAlreadySet", memory.timer_set, instead_of.timer_set);
}

Memory remembered()
{
    const auto number = [](std::string_view field) { return static_cast<unsigned>(LayerTest::record(field)); };
    Memory memory;
    for (unsigned output = 0; output < 4; ++output)
    {
        const std::string entry = entry_fields[output];
        memory.last.outputs[output] = { number(entry + "fgOutputEnable") != 0, number(entry + "eResMode") };
    }
    memory.last.frequency = number("ucVfreq");
    memory.last.chip = number("rDrvExtScl");
    memory.last.osd5 = number("fgOSD5");
    memory.format = number("ucMode");
    memory.tv_type = number("ucTvType");
    memory.set_before = number("fgSetModeCalled") != 0;
    memory.first_after_load = number("_fgBootUp") != 0;
    memory.format_change = number("status.fgPmxFormatChangeFlag") != 0;
    memory.osd_owed = number("status.fgPmxEnabeOsdFlag") != 0;
    memory.timer_set = number("status.fgTimerAlreadySet") != 0;
    return memory;
}

/** A request: these outputs on, the one that gives the format in an HD or SD mode, and component's own mode HD or SD.
 *  No two outputs have the same mode. */
Wanted wanted(unsigned enables, bool mixer_hd, bool component_hd, unsigned osd5)
{
    constexpr unsigned hd[] = { RES_720P60HZ, RES_1080P60HZ, RES_1080I60HZ, RES_1080P24HZ };
    constexpr unsigned sd[] = { RES_480P, RES_576P, RES_480I, RES_576I };
    Wanted wanted;
    unsigned source = 1;
    for (unsigned output = 4; output-- > 0;)
    {
        wanted.outputs[output].on = (enables >> output & 1) != 0;
        wanted.outputs[output].mode = output == 3 ? sd[output] : hd[output];
        if (wanted.outputs[output].on)
            source = output;
    }
    wanted.outputs[2].mode = component_hd ? hd[2] : sd[2];
    wanted.outputs[source].mode = mixer_hd ? hd[source] : sd[source];
    wanted.osd5 = osd5;
    return wanted;
}

unsigned format_of(const Wanted& wanted)
{
    for (const OutputState& output : wanted.outputs)
    {
        if (output.on)
            return output.mode;
    }
    return wanted.outputs[1].mode;
}

} // namespace

class Sweep : public mode_ex::Test
{
protected:
    /** Things that vary along: each goes through its values in its own rhythm. */
    bool rhythm(unsigned period) const { return m_calls / period % 2 != 0; }

    /** What the layer remembers of a last request that is this one but for the entries in `changed`, bit by bit: in
     *  turn switched on or off, or in another mode. */
    Memory same_but_for(unsigned changed, unsigned last_osd5, const Wanted& wanted) const
    {
        Memory memory;
        memory.last = wanted;
        memory.last.osd5 = last_osd5;
        memory.format = format_of(wanted);
        for (unsigned output = 0; output < 4; ++output)
        {
            OutputState& entry = memory.last.outputs[output];
            if ((changed >> output & 1) != 0 && rhythm(2 + output))
                entry.on = !entry.on;
            else if ((changed >> output & 1) != 0)
                entry.mode = RES_1080P50HZ;
        }
        memory.format_change = rhythm(3);
        memory.timer_set = rhythm(5);
        return memory;
    }

    void surround_with(const Surroundings& board)
    {
        if (m_calls == 0 || board.sink != m_board.sink)
            board::hdmi_av::plug(board.sink);
        if (m_calls == 0 || board.resolution_wanted != m_board.resolution_wanted)
            board::hdmi_av::request_resolution(board.resolution_wanted);
        board::video_planes::set_waiting_for_sync(board.video_plane_waits);
        m_board = board;
    }

    void check(Memory memory, const Wanted& wanted, bool sink)
    {
        surround_with({ .sink = sink, .resolution_wanted = rhythm(7), .video_plane_waits = rhythm(11) });
        remember(memory, m_calls == 0 ? remembered() : m_memory);
        board::trace::clear();
        const auto given = [&wanted](unsigned output) {
            return mode_ex::output(wanted.outputs[output].on, wanted.outputs[output].mode);
        };
        const UINT32 result = set_mode({ .digital_port = given(0),
                                         .hdmi = given(1),
                                         .component = given(2),
                                         .composite = given(3),
                                         .frequency = static_cast<UCHAR>(wanted.frequency),
                                         .chip = static_cast<DRV_EXT_CHIP_USAGE_T>(wanted.chip),
                                         .osd5 = static_cast<UINT8>(wanted.osd5) });
        const std::string expected = expected_lines(memory, wanted, m_board);
        ASSERT_EQ(1u, result);
        ASSERT_EQ(expected, observed_lines(board::trace::entries())) << "call " << m_calls;
        if (m_calls % 7 == 0) // reading the record field by field takes its time
        {
            ASSERT_TRUE(memory == remembered()) << "call " << m_calls << " is remembered wrongly:\n" << expected;
        }
        m_memory = memory;
        ++m_calls;
    }

    /** Every combination of enables and component's mode HD or SD where it counts. */
    static std::vector<Wanted> all_outputs(bool mixer_hd)
    {
        std::vector<Wanted> all;
        for (unsigned enables = 0; enables < 16; ++enables)
        {
            const bool component_is_second = (enables & 4) != 0 && (enables & 3) != 0;
            all.push_back(wanted(enables, mixer_hd, false, 0));
            if (component_is_second)
                all.push_back(wanted(enables, mixer_hd, true, 0));
        }
        return all;
    }

    /** Every combination of outputs, of HDMI, component and composite that changed, of fifth-OSD modes before and
     *  after. */
    void same_format(bool mixer_hd, bool sink)
    {
        running();
        for (Wanted request : all_outputs(mixer_hd))
        {
            for (unsigned changed = 0; changed < 16; changed += 2)
            {
                for (unsigned osd5 = 0; osd5 < 9; ++osd5)
                {
                    request.osd5 = osd5 % 3;
                    request.frequency = rhythm(17) ? 50 : 60;
                    const unsigned port_changed = rhythm(13) ? 1 : 0;
                    ASSERT_NO_FATAL_FAILURE(
                        check(same_but_for(changed | port_changed, osd5 / 3, request), request, sink));
                }
            }
        }
        EXPECT_EQ(22u * 8 * 9, m_calls);
    }

    Memory m_memory; ///< what the layer is known to remember
    Surroundings m_board;
    unsigned m_calls = 0;
};

TEST_F(Sweep, SetModeEx_SameFormat_SdMixer_NoSink)
{
    same_format(false, false);
}

TEST_F(Sweep, SetModeEx_SameFormat_SdMixer_Sink)
{
    same_format(false, true);
}

TEST_F(Sweep, SetModeEx_SameFormat_HdMixer_NoSink)
{
    same_format(true, false);
}

TEST_F(Sweep, SetModeEx_SameFormat_HdMixer_Sink)
{
    same_format(true, true);
}

TEST_F(Sweep, SetModeEx_FullChange_EveryCombinationOfOutputsFifthOsdAndSink_ForEveryReason)
{
    running();
    for (unsigned round = 0; round < 2 * 3 * 2; ++round)
    {
        for (Wanted request : all_outputs(round % 2 != 0))
        {
            request.osd5 = round / 2 % 3;
            request.frequency = rhythm(17) ? 50 : 60;
            const unsigned changed = m_calls * 2 % 16;
            Memory memory = same_but_for(changed, m_calls % 3, request);
            switch (m_calls % 5)
            {
            case 0: memory.format = RES_720P50HZ; break;
            case 1: memory.last.frequency = request.frequency == 50 ? 60 : 50; break;
            case 2: memory.last.chip = DRV_EXT_SCL_INT_TX; break;
            case 3: memory.set_before = false; break;
            default: memory.first_after_load = true; break;
            }
            ASSERT_NO_FATAL_FAILURE(check(memory, request, round / 6 != 0));
        }
    }
    EXPECT_EQ(22u * 12, m_calls);
}
