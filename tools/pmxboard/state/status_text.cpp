// SPDX-License-Identifier: MIT OR GPL-2.0-only
// A status for people, and for programs.
#include "board/json.h"
#include "tools/pmxboard/state/status.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/record_view/mode_table.h"

namespace pmxboard
{
namespace
{

using board::Json;
using board::json_of;
using board::Value;
using record_view::ColourGroup;
using State = GraphicsStatus::State;

bool is_there(const Value& value)
{
    return value.kind() != Value::Kind::Null;
}

/** A moment, as a trace has it, without zeros behind the point. */
std::string moment(std::int64_t us)
{
    std::string text = std::to_string(us / 1000);
    if (us % 1000 != 0)
    {
        std::string fraction = std::to_string(1000 + us % 1000).substr(1);
        text += "." + fraction.substr(0, fraction.find_last_not_of('0') + 1);
    }
    return text + " ms";
}

std::string padded(std::string text, std::size_t columns)
{
    text.append(columns > columns_of(text) ? columns - columns_of(text) : 0, ' ');
    return text + " ";
}

std::string without_end(std::string line)
{
    return line.substr(0, line.find_last_not_of(' ') + 1) + "\n";
}

record_view::ModeRow row_of(const Value& mode)
{
    return record_view::mode_row(static_cast<unsigned>(mode.as_number()));
}

std::string size_text(const Value& width, const Value& height)
{
    return is_there(width) ? width.to_text() + "x" + height.to_text() : "-";
}

std::string standard_of(const Value& mode)
{
    const ColourGroup group = row_of(mode).colour;
    return group == ColourGroup::Sd ? "BT.601" : group == ColourGroup::Hd ? "BT.709" : "-";
}

/** "YCbCr BT.709": what a plane's pictures are. */
std::string pictures_of(const PlaneStatus& plane)
{
    const std::string name = plane.colour.to_text();
    return name == "DRV_PMX_CS_YCBCR_601"                                 ? "YCbCr BT.601"
           : name == "DRV_PMX_CS_YCBCR_709"                               ? "YCbCr BT.709"
           : name == "DRV_GFX_COLOR_MODE_RGB" || name == "DRV_PMX_CS_RGB" ? "RGB"
                                                                          : name;
}

std::string mixer_text(const Status& status, const Look& look)
{
    std::string text = look.bold("Mixer") + "      ";
    if (!status.initialised)
        return text + "nobody has called PMX_Init\n";
    text += status.mode.to_text() + " at " + status.frequency.to_text() + " Hz, " + status.tv_type.to_text() +
            ", master enable " + (status.enabled ? "on" : "off");
    text += status.muted ? ", muted" : "";
    text += status.colour_bar ? ", colour bar" : "";
    return text + "\n";
}

/** What a product's mixer lacks that the layer would do for it. */
std::string capability_text(const Status& status, const Look& look)
{
    const std::uint32_t all = record_view::default_capability();
    if (!status.initialised || !status.capability || *status.capability == all)
        return {};
    const auto lacks = [&](unsigned bit) { return ((all & ~*status.capability) >> bit & 1) != 0; };
    unsigned modes = 0;
    for (const record_view::ModeRow& mode : record_view::mode_rows())
        modes += mode.capability && lacks(*mode.capability) ? 1 : 0;
    std::string text = "  capability " + Value::number(*status.capability, {}, Value::Base::Hex).to_text() +
                       ": refuses " + std::to_string(modes) + (modes == 1 ? " mode" : " modes");
    for (const auto& [bit, feature] : record_view::capability_features())
        text += lacks(bit) ? ", " + feature : "";
    return wrapped(text, look.width, 0, 4);
}

/** What a sink of its own kind takes, the one it likes best first. */
std::string modes_text(const std::vector<Value>& modes)
{
    std::string text;
    for (const Value& mode : modes)
    {
        const Value* const name = mode.find("mode");
        const Value* const frequency = mode.find("frequency");
        if (name != nullptr && frequency != nullptr)
            text += (text.empty() ? "" : ", ") + name->to_text() + " at " + frequency->to_text() + " Hz";
    }
    return printable(text);
}

std::string sink_text(const SinkStatus& sink)
{
    if (!sink.plugged)
        return "none is plugged in";
    if (!is_there(sink.takes_mode) && !sink.modes.empty())
        return "plugged in, takes " + modes_text(sink.modes);
    if (!is_there(sink.takes_mode))
        return "plugged in, takes any mode";
    return "plugged in, takes " + sink.takes_mode.to_text() + " at " + sink.takes_frequency.to_text() +
           " Hz whatever is asked";
}

std::string output_text(const OutputStatus& output)
{
    const std::string line = "  " + padded(std::string(output.name), 9);
    if (!is_there(output.mode))
        return without_end(line + padded(output.on ? "off" : "not set yet", 38) + output.remark);
    const auto row = row_of(output.mode);
    return without_end(line + padded(output.mode.to_text(), 15) +
                       padded(size_text(Value::number(row.width), Value::number(row.height)), 9) +
                       padded(output.frequency.to_text(), 3) + padded(standard_of(output.mode), 8) + output.remark);
}

std::string outputs_text(const Status& status, const Look& look)
{
    std::string text = look.bold("Output      shows           size      Hz  colour") + "\n";
    for (const OutputStatus& output : status.outputs)
        text += output_text(output);
    return text + wrapped("  HDMI sink: " + sink_text(status.sink), look.width, 0, 4);
}

std::string plane_text(const PlaneStatus& plane)
{
    const bool delivers = is_there(plane.width);
    return without_end("  " + padded(std::to_string(plane.plane), 4) + padded(plane.mixed ? "yes" : "no", 6) +
                       padded(plane.position ? std::to_string(*plane.position) : "-", 6) + padded(plane.source, 7) +
                       padded(size_text(plane.width, plane.height), 10) +
                       (delivers          ? pictures_of(plane)
                        : plane.connected ? "connected"
                                          : "-"));
}

std::string planes_text(const Status& status, const Look& look)
{
    std::string text = look.bold("Plane  mixed  stack  source  size       pictures") + "\n";
    for (const PlaneStatus& plane : status.planes)
        text += plane_text(plane);
    for (const std::string& pair : status.swaps)
        text += "  planes " + pair + " are swapped\n";
    return text;
}

/** "planes 3 to 7", "plane 4" */
std::string named_planes(const std::vector<unsigned>& planes)
{
    if (planes.size() == 1)
        return "plane " + std::to_string(planes.front());
    const bool in_a_row = planes.back() - planes.front() + 1 == planes.size();
    if (in_a_row)
        return "planes " + std::to_string(planes.front()) + " to " + std::to_string(planes.back());
    std::string text = "planes";
    for (const unsigned plane : planes)
        text += (plane == planes.front() ? " " : plane == planes.back() ? " and " : ", ") + std::to_string(plane);
    return text;
}

std::string ends_of_waiting(const GraphicsStatus& graphics)
{
    std::string text = "until the display part answers";
    text += graphics.answer_us ? " at " + moment(*graphics.answer_us) : "";
    if (graphics.timer_us)
        return text + "; the timer ends the wait at " + moment(*graphics.timer_us);
    text += "; no timer ends the wait";
    if (!graphics.lost_by)
        return text;
    text += *graphics.lost_by == "PMX_Uninit" ? ": PMX_Uninit has deleted it, and PMX_Init would forget the wait"
                                              : ": the layer has none since " + *graphics.lost_by;
    return text + ". PMX_SetFormatChangeFlag(FALSE) brings them back";
}

/** Of graphics that are out while both flags are clear. */
std::string why_out(const GraphicsStatus& graphics)
{
    const std::string out = named_planes(graphics.planes) + " out of the mix, ";
    if (graphics.answer_us && (!graphics.timer_us || *graphics.answer_us < *graphics.timer_us))
        return out + "owed by nobody; the display part's answer at " + moment(*graphics.answer_us) +
               " brings them back";
    if (graphics.timer_us)
        return out + "owed by nobody; the timer brings them back at " + moment(*graphics.timer_us);
    if (!are_forgotten(graphics))
        return out + "and nothing is announced that brings them back";
    return out + "and nothing is announced that brings them back: " +
           (graphics.lost_by ? *graphics.lost_by + " has forgotten that they were held back"
                             : "PMX_Init, PMX_Reset or PMX_SetOsdEnableFlag has forgotten them, or a neighbour has "
                               "taken them out") +
           ". PMX_SetFormatChangeFlag(FALSE) brings them back, or the end of the next change that the display part "
           "announces";
}

std::string graphics_sentence(const GraphicsStatus& graphics)
{
    switch (graphics.state)
    {
    case State::Held:
        return "held back" + (graphics.since_us ? " since " + moment(*graphics.since_us) : std::string()) +
               " by PMX_SetModeEx: " + named_planes(graphics.planes) + " wait " + ends_of_waiting(graphics);
    case State::AwaitsVideoPlane:
        return "held back by the video plane: " + named_planes(graphics.planes) +
               " wait until it has its sync control and calls PMX_SetOsdEnable";
    case State::Out: return why_out(graphics);
    case State::Switching: return "shown, while the display part switches";
    case State::Shown: break;
    }
    return "shown" + (graphics.timer_us ? "; the timer of the last wait runs until " + moment(*graphics.timer_us)
                                        : std::string());
}

std::string graphics_text(const Status& status, const Look& look)
{
    const std::string text = wrapped("Graphics   " + graphics_sentence(status.graphics), look.width, 0, 11);
    return look.bold(text.substr(0, 8)) + text.substr(8);
}

std::string disagreements_text(const Status& status, const Look& look)
{
    std::string text;
    for (const std::string& disagreement : status.disagreements)
        text += wrapped(printable(disagreement), look.width, 2, 4);
    return text.empty() ? text : look.bold("The record and the hardware disagree") + "\n" + text;
}

std::string replaced_text(const Status& status, const Look& look)
{
    std::string text;
    for (const std::string& function : status.replaced)
        text += (text.empty() ? "" : ", ") + function;
    if (text.empty())
        return text;
    return look.bold("Not the board's own, so that what they have set is not known here") + "\n" +
           wrapped(printable(text), look.width, 2, 2);
}

std::string all_text(const Status& status, const Look& look)
{
    return look.bold("Board " + printable(status.board)) + ", " + moment(status.now_us) + " after power-on\n" +
           mixer_text(status, look) + capability_text(status, look) + outputs_text(status, look) +
           planes_text(status, look) + graphics_text(status, look) + disagreements_text(status, look);
}

/* For programs. */

const char* name_of(State state)
{
    switch (state)
    {
    case State::Shown: return "shown";
    case State::Switching: return "switching";
    case State::Held: return "held";
    case State::AwaitsVideoPlane: return "awaits video plane";
    case State::Out: break;
    }
    return "out";
}

template <typename Number>
Json number_or_null(const std::optional<Number>& number)
{
    return number ? Json(static_cast<std::int64_t>(*number)) : Json();
}

Json json_of_size(const Value& width, const Value& height)
{
    if (!is_there(width))
        return nullptr;
    return { { "width", json_of(width) }, { "height", json_of(height) } };
}

Json json_of(const OutputStatus& output)
{
    Json json = { { "name", std::string(output.name) },       { "on", number_or_null(output.on) },
                  { "mode", json_of(output.mode) },           { "size", nullptr },
                  { "frequency", json_of(output.frequency) }, { "colour", nullptr } };
    if (!is_there(output.mode))
        return json;
    const auto row = row_of(output.mode);
    json["size"] = json_of_size(Value::number(row.width), Value::number(row.height));
    if (row.colour != ColourGroup::None)
        json["colour"] = standard_of(output.mode);
    return json;
}

Json json_of(const PlaneStatus& plane)
{
    return { { "plane", plane.plane },
             { "mixed", static_cast<int>(plane.mixed) },
             { "position", number_or_null(plane.position) },
             { "source", plane.source },
             { "connected", static_cast<int>(plane.connected) },
             { "size", json_of_size(plane.width, plane.height) },
             { "colour", json_of(plane.colour) } };
}

Json json_of(const GraphicsStatus& graphics)
{
    const bool is_held = graphics.state == State::Held;
    return { { "state", name_of(graphics.state) },
             { "planes", graphics.planes },
             { "by", is_held                                     ? Json("PMX_SetModeEx")
                     : graphics.state == State::AwaitsVideoPlane ? Json("video plane")
                                                                 : Json() },
             { "since_us", number_or_null(graphics.since_us) },
             { "answer_us", number_or_null(graphics.answer_us) },
             { "timer_us", number_or_null(graphics.timer_us) },
             { "lost_by", graphics.lost_by ? Json(*graphics.lost_by) : Json() } };
}

Json json_of(const Status& status)
{
    Json outputs = Json::array();
    for (const OutputStatus& output : status.outputs)
        outputs.push_back(json_of(output));
    Json planes = Json::array();
    for (const PlaneStatus& plane : status.planes)
        planes.push_back(json_of(plane));
    Json modes = Json::array();
    for (const Value& mode : status.sink.modes)
        modes.push_back(json_of(mode));
    const Json takes = is_there(status.sink.takes_mode) ? Json{ { "mode", json_of(status.sink.takes_mode) },
                                                                { "frequency", json_of(status.sink.takes_frequency) } }
                                                        : Json();
    return { { "board", status.board },
             { "now_us", status.now_us },
             { "initialised", static_cast<int>(status.initialised) },
             { "mixer",
               { { "enabled", static_cast<int>(status.enabled) },
                 { "mode", json_of(status.mode) },
                 { "frequency", json_of(status.frequency) },
                 { "tv_type", json_of(status.tv_type) },
                 { "colour_space", json_of(status.colour_space) },
                 { "capability",
                   status.capability ? json_of(Value::number(*status.capability, {}, Value::Base::Hex)) : Json() },
                 { "muted", static_cast<int>(status.muted) },
                 { "colour_bar", static_cast<int>(status.colour_bar) },
                 { "swapped_planes", status.swaps } } },
             { "outputs", outputs },
             { "sink",
               { { "plugged", static_cast<int>(status.sink.plugged) }, { "takes", takes }, { "modes", modes } } },
             { "planes", planes },
             { "graphics", json_of(status.graphics) },
             { "disagreements", status.disagreements } };
}

/** With what only few programs have. */
Json whole_json_of(const Status& status)
{
    Json json = json_of(status);
    if (!status.replaced.empty())
        json["replaced"] = status.replaced;
    return json;
}

} // namespace

std::string to_text(const Status& status, StatusPart part, const Look& look)
{
    switch (part)
    {
    case StatusPart::Outputs: return outputs_text(status, look);
    case StatusPart::Planes: return planes_text(status, look);
    case StatusPart::Graphics: return graphics_text(status, look);
    case StatusPart::All: break;
    }
    return all_text(status, look) + replaced_text(status, look);
}

std::string to_json(const Status& status)
{
    Json json = { { "schema", "pmxboard-status" }, { "version", status_schema_version } };
    json.update(whole_json_of(status));
    return board::written(json, 2);
}

std::string to_json_line(const Status& status)
{
    Json json = { { "kind", "status" }, { "version", status_schema_version } };
    json.update(whole_json_of(status));
    return board::written(json);
}

} // namespace pmxboard
