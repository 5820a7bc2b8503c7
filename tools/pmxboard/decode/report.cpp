// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/report.h"

#include <algorithm>

#include "board/json.h"
#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view output_names[] = { "digital port", "HDMI", "component", "composite" };

/** What the report labels as an input format may be the output's, when that has 12 bits. */
constexpr std::string_view mislabelled = "CCIR_YCMIX_12BIT";

/** Never filled by the layer: worth a line only when it is. */
constexpr std::string_view delays_and_levels[] = { "ucCavYcInputDelay",   "ucCavYcOutputDelay", "ucCvbsYcInputDelay",
                                                   "ucCvbsYcOutputDelay", "ucCavSyncLvl",       "ucCvbsSyncLvl",
                                                   "ucCvbsBurstLvl",      "ucCavYLvl",          "ucCvbsYLvl" };

bool is_index(std::string_view name)
{
    return name == "ucPmxId" || name == "conf" || name == "i";
}

bool is_order_line(const Item& item)
{
    return has(item.text->values, "aucPlaneOrder");
}

using board::Json;

/** The fields as the record names them; what stands twice once. */
Json json_of(const std::map<std::string, std::string, std::less<>>& fields)
{
    Json json = Json::object();
    for (const auto& [name, printed] : fields)
    {
        const auto number = number_of(printed, name == "u4PlaneOrder" ? 16 : 10);
        if (name == "E" || name == "eColorSpace") // the bus width and the master colour space once more
            continue;
        if (name == "eReportedMode")
            json["eResMode"] = reported_mode(printed);
        else if (name == "u4Capability" || name == "u4BgColor" || name == "u4PlaneOrder")
            json[name] = static_cast<std::uint32_t>(number.value_or(0));
        else if (number)
            json[name] = *number;
        else
            json[name] = printed;
    }
    return json;
}

template <typename Groups>
Json json_list(const Groups& groups)
{
    Json list = Json::array();
    for (std::size_t i = 0; i < groups.size(); ++i)
    {
        if (groups[i].empty())
            continue;
        list.push_back(json_of(groups[i]));
        list.back()["index"] = i;
    }
    return list;
}

} // namespace

std::string StatusReport::Fields::get(std::string_view name) const
{
    const auto found = find(name);
    return found == end() ? "?" : found->second;
}

std::string StatusReport::Fields::say(std::string_view with_names) const
{
    return sentence(with_names, [this](std::string_view name) { return get(name); });
}

std::string StatusReport::Fields::say_if(std::string_view needed, std::string_view with_names) const
{
    return contains(needed) ? say(with_names) : "";
}

/** The fields that a line belongs to; null for an index that does not exist. */
StatusReport::Fields* StatusReport::group(const Item& item)
{
    const auto has_part = [&](std::string_view part) { return item.text->format.find(part) != std::string_view::npos; };
    const auto index = static_cast<std::size_t>(item.number("i").value_or(-1));
    if (is_order_line(item))
        return index < m_ports.size() ? &m_order : nullptr;
    if (has_part("arPortInfo"))
        return index < m_ports.size() ? &m_ports[index] : nullptr;
    if (has_part("arOutputConf"))
        return index < m_outputs.size() ? &m_outputs[index] : nullptr;
    return &m_record;
}

bool StatusReport::wants(const Item& item)
{
    const Fields* const fields = group(item);
    if (fields == nullptr)
        return true;
    if (item.text->format.starts_with("Mode("))
        return false;
    if (is_order_line(item))
        return !fields->contains(item.value("i"));
    const std::vector<std::string_view> names = split(item.text->values);
    return std::none_of(names.begin(), names.end(), [&](std::string_view name) {
        // The mode stands in two lines, a 12-bit output format under the input's label.
        const bool twice = name == "ucMode" || (name == "eDgiFmt" && !fields->contains("eDgoFmt"));
        return !is_index(name) && !twice && fields->contains(name);
    });
}

void StatusReport::add(const Item& item)
{
    Fields* const fields = group(item);
    if (fields == nullptr)
        return;
    if (is_order_line(item))
    {
        (*fields)[item.value("i")] = item.value("aucPlaneOrder");
        return;
    }
    m_external_line = m_external_line || has(item.text->values, "rDrvExtScl");
    const bool input_again =
        has(item.text->values, "eDgiFmt") && (fields->contains("eDgiFmt") || fields->contains("eDgiMode"));
    // Its input's mode is missing between: what was taken for the input's format is the output's.
    if (has(item.text->values, "eDgoMode") && !fields->contains("eDgiMode") && !fields->contains("eDgoFmt") &&
        fields->get("eDgiFmt") == mislabelled)
    {
        (*fields)["eDgoFmt"] = mislabelled;
        fields->erase("eDgiFmt");
    }
    for (const std::string_view name : split(item.text->values))
    {
        if (!is_index(name))
            (*fields)[std::string(input_again ? "eDgoFmt" : name)] = item.value(name);
    }
}

void StatusReport::tell_record(std::vector<std::string>& lines) const
{
    const Fields& record = m_record;
    const auto tell = [&](std::string_view needed, std::string_view with_names) {
        lines.push_back(record.say_if(needed, with_names));
    };
    if (record.contains("ucMode"))
        lines.push_back(record.say("mixer format {ucMode}") +
                        record.say_if("ucVfreq", " at {ucVfreq} Hz, TV type {ucTvType:standard}") +
                        record.say_if("fgSetModeCalled", "; {fgSetModeCalled:called}"));
    if (record.contains("eColorSpace"))
        tell("eColorSpace", "master colour space {eColorSpace}");
    else
        tell("eMasterColorSpace", "master colour space {eMasterColorSpace}");
    tell("E", "E({E}) is the digital port's bus width; the report does not show the master enable");
    tell("E", "digital port: switch {ucDigitalOut:switch}, {ucDigitalBit} bits, phase {u4Phase}, proprietary mode "
              "{ucProprietaryMode}");
    if (const auto word = number_of(record.get("u4Capability")))
    {
        for (const std::string& line : capability_words(static_cast<std::uint32_t>(*word)))
            lines.push_back(line);
    }
    tell("rDrvExtScl", "external chip {rDrvExtScl}");
    if (!m_external_line && m_ports.back().contains("eSrcColorSpace") && !m_outputs.front().empty())
        lines.push_back("external chip: no line, as of DRV_RX_BYPASS_TX or a value without a name");
    tell("fgForceMode", "force mode {fgForceMode:switch}; digest view {fgDigestEnable}, its ratio {u4DigestAsp}");
    tell("fgOSD5", "fifth OSD plane {fgOSD5}");
}

void StatusReport::tell_picture(std::vector<std::string>& lines) const
{
    const Fields& record = m_record;
    const auto tell = [&](std::string_view needed, std::string_view with_names) {
        lines.push_back(record.say_if(needed, with_names));
    };
    tell("ucBrightness", "digital colour format {ucDigitalRgb:format}, gamma {ucGamma:gamma}");
    tell("ucBrightness", "brightness {ucBrightness}, contrast {ucContrast}, hue {ucHue}, saturation {ucSaturation}; "
                         "black level: component {ucCAVBlackLv}, composite {ucCVBSBlackLv}");
    tell("u4BgColor", "colour bar {ucCBEnable:switch}, mute {ucMuteEnable:switch}, sharpness {ucSharpness}, "
                      "background {u4BgColor:yuv}");
    tell("u4BgColor", record.is("fgAspNext", "0")
                          ? "aspect ratio {u4AspectRatio}"
                          : "aspect ratio {u4AspectRatio}; {u4AspNext} waits for the next mode change");
    const bool filled = std::any_of(std::begin(delays_and_levels), std::end(delays_and_levels),
                                    [&](std::string_view name) { return !record.is(name, "0"); });
    if (filled && record.contains("ucCvbsYLvl"))
        tell("ucCavSyncLvl", "delays in and out: component {ucCavYcInputDelay}, {ucCavYcOutputDelay}; composite "
                             "{ucCvbsYcInputDelay}, {ucCvbsYcOutputDelay}; levels of sync and luma: component "
                             "{ucCavSyncLvl}, {ucCavYLvl}; composite {ucCvbsSyncLvl}, {ucCvbsYLvl}, burst "
                             "{ucCvbsBurstLvl}");
}

void StatusReport::tell_order(std::vector<std::string>& lines) const
{
    if (!m_order.empty())
        lines.push_back(m_order.say("planes at positions 0 to 7: {0} {1} {2} {3} {4} {5} {6} {7}"));
    lines.push_back(m_record.say_if("u4PlaneOrder", "packed order 0x{u4PlaneOrder}: planes 1 to 8 show sources "
                                                    "{u4PlaneOrder:sources}"));
}

void StatusReport::tell_ports(std::vector<std::string>& lines) const
{
    std::vector<std::string> idle;
    for (std::size_t i = 0; i < m_ports.size(); ++i)
    {
        const Fields& port = m_ports[i];
        if (port.empty())
            continue;
        if (port.is("fgConnected", "0") && port.is("fgEnabled", "0"))
        {
            idle.push_back(std::to_string(i));
            continue;
        }
        std::string line = "port " + std::to_string(i) + ": ";
        line += port.is("fgConnected", "?")   ? "source unknown"
                : port.is("fgConnected", "0") ? "not connected"
                                              : port.say("{u2CompType} {u2CompId} connected");
        line += port.say_if("fgEnabled", port.is("fgEnabled", "0") ? ", idle" : ", delivers pictures");
        line += port.say_if("eSrcColorSpace", ", source {eSrcColorSpace} (labelled eMasterColorSpace)");
        line += port.say_if("eInputColorMode", port.get("eInputColorMode").ends_with("RGB") ? ", RGB" : ", YCbCr");
        lines.push_back(line + (port.is("ucLumaKey", "0") ? "" : port.say_if("ucLumaKey", ", luma key {ucLumaKey}")));
    }
    if (!idle.empty())
        lines.push_back("ports neither connected nor delivering: " + joined(idle, ", "));
}

std::string StatusReport::mode_of(const Fields& output)
{
    if (!output.contains("eReportedMode"))
        return output.contains("u4VFreq") && output.contains("eDgiFmt") ? "no line with a mode, as of those above 41"
                                                                        : "mode not in the log";
    const std::string printed = output.get("eReportedMode");
    return output.say("{eReportedMode}") + (reported_mode(printed) == printed ? "" : " (reported as " + printed + ")");
}

void StatusReport::tell_outputs(std::vector<std::string>& lines) const
{
    for (std::size_t i = 0; i < m_outputs.size(); ++i)
    {
        const Fields& output = m_outputs[i];
        const auto is_set = [&](std::string_view name, std::string_view unset) {
            return output.contains(name) && !output.is(name, unset);
        };
        if (output.empty())
            continue;
        std::string line = "output " + std::string(output_names[i]) + ": " + output.say("{fgOutputEnable:switch}") +
                           ", " + mode_of(output);
        if (is_set("eDgiMode", "CCIR_INVALID") || is_set("eDgiFmt", "CCIR_NON_USED"))
            line += output.say(", digital input {eDgiMode} {eDgiFmt}");
        if (is_set("eDgoMode", "CCIR_INVALID") || is_set("eDgoFmt", "CCIR_NON_USED"))
            line += output.say(", digital output {eDgoMode} {eDgoFmt}");
        lines.push_back(line +
                        (output.is("eDgoFmt", mislabelled) ? " (the output's format, labelled as the input's)" : ""));
    }
}

std::vector<std::string> StatusReport::words() const
{
    std::vector<std::string> lines;
    tell_record(lines);
    tell_picture(lines);
    tell_order(lines);
    tell_ports(lines);
    tell_outputs(lines);
    std::erase(lines, "");
    return lines;
}

Json StatusReport::json() const
{
    Json report = json_of(m_record);
    report["aucPlaneOrder"] = json_of(m_order);
    report["arPortInfo"] = json_list(m_ports);
    report["arOutputConf"] = json_list(m_outputs);
    return report;
}

} // namespace pmxboard::decode
