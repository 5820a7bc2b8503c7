// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/layer/mode_ex_rule.h"

#include <algorithm>
#include <map>

#include "drv_if_pmx.h"

namespace mode_ex
{
namespace
{

struct Mode
{
    const char* name;
    bool hd;
    bool sixty_hertz_pll;
};

const std::map<unsigned, Mode> modes{
    { 0, { "RES_480I", false, true } },       { 1, { "RES_576I", false, false } },
    { 2, { "RES_480P", false, true } },       { 3, { "RES_576P", false, false } },
    { 8, { "RES_720P60HZ", true, true } },    { 9, { "RES_720P50HZ", true, false } },
    { 10, { "RES_1080I60HZ", true, true } },  { 11, { "RES_1080I50HZ", true, false } },
    { 12, { "RES_1080P60HZ", true, true } },  { 13, { "RES_1080P50HZ", true, false } },
    { 18, { "RES_1080P24HZ", true, false } },
};

enum Output
{
    digital_port,
    hdmi,
    component,
    composite
};

/** The numbers of a value, without names. */
void append(std::string& line, const board::Value& value)
{
    using Kind = board::Value::Kind;
    if (value.kind() == Kind::Number)
        line += std::to_string(value.as_number());
    else if (value.kind() != Kind::Record)
        line += value.to_text();
    else
    {
        const char* separator = "{";
        for (const board::Value& member : value.items())
        {
            line += separator;
            append(line, member);
            separator = ", ";
        }
        line += "}";
    }
}

class Rule
{
public:
    Rule(Memory& memory, const Wanted& wanted, const Surroundings& board)
        : m_memory(memory), m_before(memory), m_wanted(wanted), m_board(board)
    {
        const auto first = std::find_if(wanted.outputs.begin(), wanted.outputs.end(),
                                        [](const OutputState& output) { return output.on; });
        m_any_on = first != wanted.outputs.end();
        m_format = m_any_on ? first->mode : wanted.outputs[hdmi].mode;
        m_hd = modes.at(m_format).hd;

        const Wanted& last = m_before.last;
        const bool same_format = m_before.format == m_format && last.frequency == wanted.frequency &&
                                 m_before.set_before && last.chip == wanted.chip;
        m_hdmi_equal = last.outputs[hdmi] == wanted.outputs[hdmi];
        m_full = m_before.first_after_load || !same_format;
        m_sends_hdmi = m_full || !m_hdmi_equal || board.resolution_wanted;
        m_sets_encoders = m_full || last.outputs[component] != wanted.outputs[component] ||
                          last.outputs[composite] != wanted.outputs[composite] || last.osd5 != wanted.osd5;
    }

    std::string lines()
    {
        remember();
        introduce();
        if (m_full)
            change_format();
        else
            keep_format();
        decide_whether_to_wait();
        return m_lines;
    }

private:
    template <typename... Numbers>
    void call(const char* function, Numbers... numbers)
    {
        std::string arguments;
        ((arguments += (arguments.empty() ? "" : ", ") + std::to_string(numbers)), ...);
        m_lines += function + ("(" + arguments + ")\n");
    }

    void log(int level, const std::string& text) { m_lines += "LOG" + std::to_string(level) + " " + text + "\n"; }

    /** The mode that an output runs: its own, or the mixer's while it is off. */
    unsigned runs(Output output) const
    {
        return m_wanted.outputs[output].on ? m_wanted.outputs[output].mode : m_format;
    }

    bool ntsc() const { return m_wanted.frequency == 60; }

    void remember()
    {
        m_memory.last = m_wanted;
        m_memory.format = m_format;
        m_memory.set_before = true;
        m_memory.first_after_load = false;
        if (m_full)
            m_memory.tv_type = ntsc() ? 0 : 3;
    }

    void introduce()
    {
        log(0, "SetModeEx");
        const char* const titles[] = { "CCIR(", "HDMI(", "CAV (", "CVBS(" };
        for (int output = digital_port; output <= composite; ++output)
        {
            const OutputState& wanted = m_wanted.outputs[static_cast<unsigned>(output)];
            log(9, titles[output] + std::to_string(int(wanted.on)) + ", " + modes.at(wanted.mode).name + ")");
        }
        log(9, "CCIR(0, 0, 0, 0)");
        log(9, "OSD5(" + std::to_string(m_wanted.osd5) + ")");
        if (!m_any_on)
            log(0, "[PMX] Warning: Disable All output, set fmt as " + std::to_string(m_format) + ".");
        if (m_before.last.frequency != m_wanted.frequency)
            set_pll(modes.at(m_format).sixty_hertz_pll ? 0x03D2F1AA : 0x03D1745E);
        if (m_hdmi_equal)
            call("fgIsHotPlugChgRes");
        log(9, std::string("HD Exist(") + (m_hd ? "1" : "0") + ")");
        call("TVE_SetMuteCtrol", m_full, runs(component), runs(composite), m_hd, m_wanted.osd5);
    }

    /** The PLL has been programmed before: its control registers already hold what the sequence gives them. */
    void set_pll(unsigned word)
    {
        const unsigned a = 0xFD00003C;
        const unsigned synthesiser = 0xFD000040;
        const unsigned b = 0xFD000044;
        const auto change = [this](unsigned address, unsigned to) {
            call("x_reg_read32", address);
            call("x_reg_write32", address, to);
        };
        change(b, 0x4017);
        call("x_reg_write32", synthesiser, word);
        change(a, 0x10002);
        change(b, 0x4017);
        call("x_thread_delay", 1);
        change(a, 0x10006);
        change(a, 0x10002);
        change(synthesiser, word | 1);
        change(synthesiser, word);
        call("x_thread_delay", 1);
        change(a, 0x10002);
        change(b, 0x4017);
    }

    void avd(unsigned command)
    {
        m_lines += "fgPmxDrvSetAvd(" + std::to_string(command) + ", {0, " + std::to_string(runs(hdmi)) + ", " +
                   std::to_string(m_format) + ", " + std::to_string(m_format) + ", " + std::to_string(m_wanted.chip) +
                   ", {0, 0, 0, 0}, " + std::to_string(m_wanted.osd5) + ", 0, " +
                   std::to_string(int(m_wanted.outputs[digital_port].on)) + ", " +
                   std::to_string(int(m_wanted.outputs[hdmi].on)) + ", 0}, 1)\n";
    }

    void route_fifth_osd()
    {
        const bool scaled_component = m_hd && !modes.at(runs(component)).hd;
        if (m_wanted.osd5 == 2 || scaled_component)
            call("_i4Osd5Out", 1, runs(composite));
        else if (m_wanted.osd5 == 1 || m_hd)
            call("_i4Osd5Out_CVBSOnly", 1, runs(composite));
        else
            call("_i4Osd5Out", 0, runs(composite));
    }

    void set_encoders()
    {
        route_fifth_osd();
        for (const Output output : { component, composite })
            call("TVE_SetFmtEx", output - component, m_format, m_wanted.frequency, runs(output),
                 m_wanted.outputs[output].on, m_hd, m_wanted.osd5);
        for (const Output output : { component, composite })
            call("TVE_SetEnable", output - component, m_wanted.outputs[output].on);
    }

    void set_colours()
    {
        log(9, "Adjust PMX_ColorSpaceSetup call sequence.");
        log(9, "Mode(" + std::to_string(m_format) + "), eMixerOutCS(1)");
        call("PMX_HalSelectVdoutCconv", 0, 1);
        call("PMX_HalSelectScalerCconv", 0, 0);
        call("PMX_HalSetCC_A", 0, !m_hd, !m_hd);
        log(9, m_hd ? "CC_A disable" : "CC_A enable, 709->601");
        call("PMX_HalSetScaler709601", 0, m_hd, m_hd);
        log(8, m_hd ? "Scaler CC enable, 709->601" : "Scaler CC disable, don't care");
    }

    void change_format()
    {
        log(1, "PMX Start to set OSD Display mode:" + std::to_string(m_format) + ".");
        call("OSD_BASE_SetDisplayMode", m_format);
        log(1, "PMX Finished to set OSD Display mode.");
        call("TVE_SetBlackScreen", 0, 0);
        call("TVE_SetBlackScreen", 1, 0);
        avd(9);
        avd(16);
        call("PMX_HalSetMode", 0, m_format);
        if (m_wanted.osd5 == 0)
            call("PMX_HalSetScalerMode", m_format);
        set_colours();
        call("VDP_SetTvFormat", m_format, 1);
        call("PMX_HalSetTvType", 0, ntsc() ? 0 : 3);
        set_encoders();
        call("PMX_HalScalerReset", 0);
        call("vPostChgRes", m_format);
        call("VDP_GlobalOutputChange");
        for (int plane = 0; plane < 3; ++plane)
            call("VDP_VsyncSendCmd", plane, 2);
        avd(10);
        call("OSD_BASE_SetFlag_PMXChangeResDone");
    }

    void keep_format()
    {
        if (m_sends_hdmi)
        {
            avd(9);
            avd(16);
        }
        if (m_sets_encoders)
            set_encoders();
        if (m_sends_hdmi)
            avd(10);
        call("VDP_SetTvFormat", m_format, 0);
        if (!m_sends_hdmi)
            call("vSendAvdNotifyScomResChgOK");
        call("PMX_HalScalerReset", 0);
    }

    void lower_format_change()
    {
        log(0, "Display Format Change :0.");
        log(0, "Set Osd Enable :1.");
        call("fgVdpIsWaitforSyncCtrl");
        m_memory.format_change = false;
        m_memory.osd_owed = m_board.video_plane_waits;
        if (m_board.video_plane_waits)
            return;
        log(0, "PMX_SetOsdEnable.");
        for (int plane = 2; plane <= 6; ++plane)
            call("vPmxMixPlane", 0, plane);
        log(0, "Set Osd Enable :0.");
    }

    void decide_whether_to_wait()
    {
        const bool worth_asking = m_sends_hdmi || m_before.timer_set;
        if (worth_asking)
            call("i4GetHotPlugStatus");
        if (!worth_asking || !m_board.sink)
        {
            log(0, std::string("[PMX] fgHdmiExist:") + (m_sends_hdmi ? "1" : "0") + ", Not wait display part...");
            lower_format_change();
        }
        log(9, std::string("[PMX] fgPMX_DisplayModeReady is ") + (m_memory.format_change ? "1." : "0."));
        if (!m_memory.format_change)
            return;
        log(0, "[PMX] VDP_SetClearVideo & Not Mix OSD..");
        call("VDP_SetClearVideo", 0, 0, 128, 128);
        for (int plane = 2; plane <= 6; ++plane)
            call("vPmxNotMixPlane", 0, plane);
        log(0, "Display Format Change Timer Set.");
        call("x_timer_stop", 2);
        m_lines += "x_timer_start(2, 10000, 1, _PMX_TmrIsr, null)\n";
        m_memory.timer_set = true;
    }

    Memory& m_memory;
    const Memory m_before;
    const Wanted& m_wanted;
    const Surroundings& m_board;
    std::string m_lines;
    bool m_any_on = false;
    unsigned m_format = 0;
    bool m_hd = false;
    bool m_full = false;
    bool m_hdmi_equal = false;
    bool m_sends_hdmi = false;
    bool m_sets_encoders = false;
};

} // namespace

std::string expected_lines(Memory& memory, const Wanted& wanted, const Surroundings& board)
{
    return Rule(memory, wanted, board).lines();
}

std::string observed_lines(const std::vector<board::TraceEntry>& entries)
{
    std::string lines;
    for (const board::TraceEntry& entry : entries)
    {
        using Kind = board::TraceEntry::Kind;
        if (entry.kind == Kind::Notice)
            continue;
        if (entry.kind == Kind::Log)
        {
            lines += "LOG" + std::to_string(entry.level) + " " + entry.text; // each ends its line itself
            continue;
        }
        lines += entry.function + "(";
        const char* separator = "";
        for (const board::TraceArgument& argument : entry.arguments)
        {
            lines += separator;
            append(lines, argument.value);
            separator = ", ";
        }
        lines += ")\n";
    }
    return lines;
}

} // namespace mode_ex
