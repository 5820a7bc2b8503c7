// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/status.h"

#include <algorithm>
#include <array>
#include <utility>

#include "drv_if_pmx.h"

namespace pmxboard
{
namespace
{

using board::Value;
using State = GraphicsStatus::State;

constexpr unsigned planes = 8;
/** Those with graphics that wait while the display part switches. */
constexpr unsigned first_held = 3;
constexpr unsigned last_held = 7;

enum OutputIndex : std::size_t
{
    digital,
    hdmi,
    component,
    composite
};
constexpr std::array<std::string_view, 4> output_names = { "digital", "HDMI", "component", "composite" };

constexpr const char* sent_to_hdmi = "hdmi_av.commands.PMX_SET_HDMI_RES_CHG";
constexpr const char* sent_to_port = "hdmi_av.commands.PMX_SET_CCIR_RES_CHG";

/** What stands at a path, with what a state lacks as null. */
class View
{
public:
    explicit View(const Value& state) : m_state(state) {}

    Value at(const std::string& path) const
    {
        const Value* const found = m_state.find(path);
        return found == nullptr ? Value::null() : *found;
    }
    std::optional<std::int64_t> number(const std::string& path) const
    {
        const Value* const found = m_state.find(path);
        if (found == nullptr || found->kind() != Value::Kind::Number)
            return std::nullopt;
        return found->as_number();
    }
    bool is_on(const std::string& path) const { return number(path).value_or(0) != 0; }
    bool has(const std::string& path) const { return at(path).kind() != Value::Kind::Null; }

private:
    const Value& m_state;
};

std::string item(const std::string& list, std::size_t index)
{
    return list + "[" + std::to_string(index) + "]";
}

/** What HDMI or the digital port was told last. */
OutputStatus told_of(const View& view, OutputIndex output, const std::string& command, const char* enable,
                     const char* mode)
{
    OutputStatus status;
    status.name = output_names[output];
    if (!view.has(command))
        return status;
    status.on = view.is_on(command + "." + enable);
    if (*status.on)
        status.mode = view.at(command + "." + mode);
    return status;
}

OutputStatus status_of_hdmi(const View& view)
{
    OutputStatus status = told_of(view, hdmi, sent_to_hdmi, "fgHdmiOutEnable", "ucHdmiOutDisplayResolution");
    status.remark = !status.on && !view.is_on("record.fgSetModeCalled") ? "what the boot loader left" : "";
    return status;
}

OutputStatus status_of_port(const View& view)
{
    OutputStatus status = told_of(view, digital, sent_to_port, "fgCCIROutEnable", "ucCCIROutResolution");
    if (view.is_on("mixer.digital_out.enabled"))
        status.remark = "the mixer's port is on, " + view.at("mixer.digital_out.bits").to_text() + " bits";
    return status;
}

OutputStatus status_of_encoder(const View& view, OutputIndex output)
{
    const std::string encoder = item("tv_encoder.encoders", output == component ? 0 : 1);
    OutputStatus status;
    status.name = output_names[output];
    if (!view.has(encoder + ".format"))
        return status;
    status.on = view.is_on(encoder + ".enabled");
    if (*status.on)
    {
        status.mode = view.at(encoder + ".format.target");
        status.frequency = view.at(encoder + ".format.frequency");
        status.remark = view.is_on(encoder + ".black_screen") ? "black" : "";
    }
    return status;
}

std::vector<OutputStatus> outputs_of(const View& view)
{
    std::vector<OutputStatus> outputs = { status_of_port(view), status_of_hdmi(view),
                                          status_of_encoder(view, component), status_of_encoder(view, composite) };
    for (OutputStatus& output : outputs)
    {
        if (output.mode.kind() != Value::Kind::Null && output.frequency.kind() == Value::Kind::Null)
            output.frequency = view.at("record.ucVfreq");
    }
    return outputs;
}

SinkStatus sink_of(const View& view)
{
    return { view.is_on("hdmi_av.sink_plugged"), view.at("hdmi_av.chosen_resolution.mode"),
             view.at("hdmi_av.chosen_resolution.frequency"), view.at("hdmi_av.sink_modes").items() };
}

struct Swap
{
    const char* key;
    unsigned one;
    unsigned other;
};
constexpr Swap swaps[] = { { "plane_1_2", 1, 2 }, { "plane_3_4", 3, 4 }, { "plane_6_7", 6, 7 },
                           { "plane_4_7", 4, 7 }, { "plane_1_3", 1, 3 }, { "plane_5_8", 5, 8 } };

/** The port that feeds each plane, from 0; swaps exchange what their planes are fed with. */
std::array<unsigned, planes> ports_of_planes(const View& view, std::vector<std::string>& swapped)
{
    std::array<unsigned, planes> ports{};
    for (unsigned plane = 0; plane < planes; ++plane)
        ports[plane] = static_cast<unsigned>(view.number(item("mixer.selectors", plane)).value_or(plane)) % planes;
    for (const Swap& swap : swaps)
    {
        if (!view.is_on(std::string("mixer.swaps.") + swap.key))
            continue;
        std::swap(ports[swap.one - 1], ports[swap.other - 1]);
        swapped.push_back(std::to_string(swap.one) + " and " + std::to_string(swap.other));
    }
    return ports;
}

/** Who feeds a port. The second one is that of three video planes: whoever connected to it last. */
std::string source_of_port(const View& view, unsigned port)
{
    if (port == 0)
        return "vdp0";
    if (port > 1)
        return "osd" + std::to_string(port - 2);
    return view.is_on("record.arPortInfo[1].fgConnected") ? "vdp" + view.at("record.arPortInfo[1].u2CompId").to_text()
                                                          : "vdp1-3";
}

PlaneStatus status_of_plane(const View& view, unsigned index, unsigned port)
{
    PlaneStatus plane;
    plane.plane = index + 1;
    plane.mixed = view.is_on(item("mixer.mixed", index));
    for (unsigned position = planes; position-- > 0;)
    {
        if (view.number(item("mixer.stacking.order", position)) == index)
            plane.position = position;
    }
    const std::string info = item("record.arPortInfo", port);
    plane.source = source_of_port(view, port);
    plane.connected = view.is_on(info + ".fgConnected");
    plane.width = view.at("sources." + plane.source + ".size.width");
    plane.height = view.at("sources." + plane.source + ".size.height");
    if (plane.width.kind() == Value::Kind::Null)
        return plane;
    const bool is_rgb = view.number(info + ".eInputColorMode") == DRV_GFX_COLOR_MODE_RGB;
    plane.colour = view.at(info + (is_rgb ? ".eInputColorMode" : ".eSrcColorSpace"));
    return plane;
}

/** The display timer: while it runs, whatever handle the layer has of it. */
std::optional<std::int64_t> timer_expiry(const View& view, std::optional<std::int64_t>& since)
{
    for (std::size_t i = 0; view.has(item("os.timers", i)); ++i)
    {
        const std::string timer = item("os.timers", i);
        const auto expiry = view.number(timer + ".expiry_us");
        if (!expiry || !view.is_on(timer + ".running") || view.at(timer + ".callback").string() != "_PMX_TmrIsr")
            continue;
        if (const auto interval = view.number(timer + ".interval_us"))
            since = *expiry - *interval;
        return expiry;
    }
    return std::nullopt;
}

State state_of_graphics(const View& view, bool is_out)
{
    if (view.is_on("status.fgPmxFormatChangeFlag"))
        return is_out ? State::Held : State::Switching;
    if (view.is_on("status.fgPmxEnabeOsdFlag"))
        return is_out ? State::AwaitsVideoPlane : State::Shown;
    return is_out ? State::Out : State::Shown;
}

bool anything_ends(const GraphicsStatus& graphics)
{
    return graphics.timer_us || graphics.answer_us;
}

/** Of graphics that nothing brings back. PMX_Reset leaves the layer without a timer, PMX_Init with one; video that was
 *  never cleared tells that nobody has held them back. */
std::optional<std::string> lost_by(const View& view, const GraphicsStatus& graphics)
{
    if (!view.has("status.hPMXTimer"))
        return std::nullopt;
    const bool has_timer = view.is_on("status.hPMXTimer");
    if (graphics.state == State::Held && !anything_ends(graphics))
    {
        if (!has_timer)
            return "PMX_Reset";
        return view.is_on("module._PmxInitiated") ? std::nullopt : std::optional<std::string>("PMX_Uninit");
    }
    if (!are_forgotten(graphics) || view.is_on("record.fgSetModeCalled") ||
        !view.has("video_planes.planes[0].clear_video"))
        return std::nullopt;
    return has_timer ? "PMX_Init" : "PMX_Reset";
}

GraphicsStatus graphics_of(const View& view)
{
    GraphicsStatus graphics;
    for (unsigned plane = first_held; plane <= last_held; ++plane)
    {
        if (!view.is_on(item("mixer.mixed", plane - 1)))
            graphics.planes.push_back(plane);
    }
    graphics.state = state_of_graphics(view, !graphics.planes.empty());
    graphics.answer_us = view.number("display_part.answer_due_us");
    std::optional<std::int64_t> started;
    graphics.timer_us = timer_expiry(view, started);
    if (graphics.state == State::Held)
        graphics.since_us = started;
    graphics.lost_by = lost_by(view, graphics);
    return graphics;
}

/* Where the record and the devices tell different things. */

using Disagreements = std::vector<std::string>;

void compare(Disagreements& found, const std::string& what, const Value& record, const Value& device)
{
    if (record.kind() == Value::Kind::Null || device.kind() == Value::Kind::Null ||
        record.as_number() == device.as_number())
        return;
    found.push_back(what + ": the record says " + record.to_text() + ", the hardware has " + device.to_text());
}

void compare_switch(Disagreements& found, const std::string& what, const Value& record, const Value& device)
{
    if (record.kind() != Value::Kind::Null && (record.as_number() != 0) != (device.as_number() != 0))
        found.push_back(what + ": the record says " + (record.as_number() != 0 ? "on" : "off") +
                        ", the hardware has it " + (device.as_number() != 0 ? "on" : "off"));
}

std::string shown_as(bool on, const Value& mode)
{
    return on ? mode.to_text() : "off";
}

/** One-mode setting tells its outputs what they run, and leaves their entries of the record as they were. */
bool set_by_one_mode(const View& view)
{
    return view.is_on(std::string(sent_to_hdmi) + ".ucCCIROutMode");
}

void compare_output(Disagreements& found, const View& view, OutputIndex index, const OutputStatus& output)
{
    const std::string entry = item("record.arOutputConf", index);
    const bool wanted = view.is_on(entry + ".fgOutputEnable");
    const Value mode = view.at(entry + ".eResMode");
    const std::string name(output.name);
    const std::string is_recorded = name + ": the record says " + shown_as(wanted, mode);
    if (!output.on && wanted)
        found.push_back(is_recorded + ", its driver has taken nothing");
    else if (output.on && (wanted != *output.on || (wanted && mode.as_number() != output.mode.as_number())))
        found.push_back(is_recorded + ", its driver has taken " + shown_as(*output.on, output.mode));
}

void compare_orders(Disagreements& found, const View& view)
{
    std::string recorded;
    std::string stacked;
    std::int64_t selected = 0;
    for (std::size_t i = 0; i < planes; ++i)
    {
        recorded += " " + view.at(item("record.aucPlaneOrder", i)).to_text();
        stacked += " " + view.at(item("mixer.stacking.order", i)).to_text();
        selected |= view.number(item("mixer.selectors", i)).value_or(0) << (4 * i);
    }
    if (view.has("mixer.stacking") && recorded != stacked)
        found.push_back("stack: the record says" + recorded + ", the hardware has" + stacked);
    const auto packed = [](std::int64_t order) { return Value::number(order, {}, Value::Base::Hex); };
    if (const auto order = view.number("record.u4PlaneOrder"))
        compare(found, "sources of the planes", packed(*order), packed(selected));
}

Disagreements disagreements_of(const View& view, const std::vector<OutputStatus>& outputs,
                               const GraphicsStatus& graphics)
{
    Disagreements found;
    if (are_forgotten(graphics))
        found.push_back("graphics: the record says that nothing waits, the hardware has planes 3 to 7 out of the mix");
    compare(found, "mode", view.at("record.ucMode"), view.at("mixer.mode"));
    compare(found, "TV type", view.at("record.ucTvType"), view.at("mixer.tv_type"));
    compare(found, "background", view.at("record.u4BgColor"), view.at("mixer.background"));
    compare_switch(found, "mute", view.at("record.ucMuteEnable"), view.at("mixer.muted"));
    compare_switch(found, "colour bar", view.at("record.ucCBEnable"), view.at("mixer.colour_bar.enabled"));
    compare_orders(found, view);
    if (!view.is_on("record.fgSetModeCalled") || set_by_one_mode(view))
        return found;
    for (const OutputIndex output : { digital, hdmi, component, composite })
        compare_output(found, view, output, outputs[output]);
    return found;
}

} // namespace

bool are_forgotten(const GraphicsStatus& graphics)
{
    return graphics.state == State::Out && graphics.planes.size() == last_held - first_held + 1 &&
           !anything_ends(graphics);
}

Status status_of(const Value& state, const std::string& board)
{
    const View view(state);
    Status status;
    status.board = board;
    status.now_us = view.number("os.now_us").value_or(0);
    status.initialised = view.number("module._PmxInitiated") == 1;
    status.enabled = view.is_on("record.ucEnable");
    status.mode = view.at("mixer.mode");
    status.frequency = view.at("record.ucVfreq");
    status.tv_type = view.at("mixer.tv_type");
    status.colour_space = view.at("record.eMasterColorSpace");
    if (const auto word = view.number("record.u4Capability"))
        status.capability = static_cast<std::uint32_t>(*word);
    status.muted = view.is_on("mixer.muted");
    status.colour_bar = view.is_on("mixer.colour_bar.enabled");
    status.outputs = outputs_of(view);
    status.sink = sink_of(view);
    const auto ports = ports_of_planes(view, status.swaps);
    for (unsigned plane = 0; plane < planes; ++plane)
        status.planes.push_back(status_of_plane(view, plane, ports[plane]));
    status.graphics = graphics_of(view);
    const Value replaced = view.at("replaced");
    for (const Value& function : replaced.items())
        status.replaced.push_back(function.string());
    if (status.initialised && status.replaced.empty())
        status.disagreements = disagreements_of(view, status.outputs, status.graphics);
    return status;
}

} // namespace pmxboard
