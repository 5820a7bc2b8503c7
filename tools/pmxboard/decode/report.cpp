#include "tools/pmxboard/decode/report.h"

#include <algorithm>

#include "board/names.h"
#include "tools/pmxboard/decode/words.h"

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view output_names[] = { "digital port", "HDMI", "component", "composite" };

/** What the report labels as an input format may be the output's, when that has 12 bits. */
constexpr std::string_view mislabelled = "CCIR_YCMIX_12BIT";

bool is_index(std::string_view name)
{
    return name == "ucPmxId" || name == "conf" || name == "i";
}

bool is_port_line(const Item& item)
{
    return item.text->format.find("arPortInfo") != std::string_view::npos;
}

bool is_output_line(const Item& item)
{
    return item.text->format.find("arOutputConf") != std::string_view::npos;
}

bool is_order_line(const Item& item)
{
    return has(item.text->values, "aucPlaneOrder");
}

template <typename Fields>
std::string get(const Fields& fields, std::string_view name, std::string_view otherwise = "?")
{
    const auto found = fields.find(name);
    return std::string(found == fields.end() ? otherwise : std::string_view(found->second));
}

template <typename Fields>
std::string words_of(const Fields& fields, std::string_view name)
{
    return fields.contains(name) ? value_words(name, get(fields, name)) : "?";
}

std::string on_off(const std::string& printed)
{
    return printed == "0" ? "off" : printed == "1" ? "on" : printed == "?" ? "?" : "on (" + printed + ")";
}

template <typename Fields>
bool all_zero(const Fields& fields, std::initializer_list<std::string_view> names)
{
    return std::all_of(names.begin(), names.end(), [&](auto name) { return get(fields, name) == "0"; });
}

} // namespace

template <typename Report>
auto* StatusReport::group(Report& report, const Item& item)
{
    if (is_order_line(item))
        return &report.m_order;
    if (!is_port_line(item) && !is_output_line(item))
        return &report.m_record;
    const auto index = static_cast<std::size_t>(item.number("i").value_or(-1));
    if (is_port_line(item))
        return index < ports ? &report.m_ports[index] : nullptr;
    return index < outputs ? &report.m_outputs[index] : nullptr;
}

bool StatusReport::wants(const Item& item) const
{
    const Fields* const fields = group(*this, item);
    if (fields == nullptr || m_lines == 0)
        return true;
    if (item.text->format.starts_with("Mode("))
        return false;
    if (is_order_line(item))
        return !fields->contains(item.value("i"));
    for (const std::string_view name : split(item.text->values))
    {
        // The mode stands in two lines, a 12-bit output format under the input's label.
        const bool twice = name == "ucMode" || (name == "eDgiFmt" && !fields->contains("eDgoFmt"));
        if (!is_index(name) && !twice && fields->contains(name))
            return false;
    }
    return true;
}

void StatusReport::add(const Item& item)
{
    ++m_lines;
    Fields* const fields = group(*this, item);
    if (fields == nullptr || item.cut != Item::Cut::None)
        return;
    if (is_order_line(item))
    {
        if (const auto position = item.number("i"); position && *position >= 0 && *position < 8)
            (*fields)[item.value("i")] = item.value("aucPlaneOrder");
        return;
    }
    m_external_line = m_external_line || has(item.text->values, "rDrvExtScl");
    const bool input_again =
        has(item.text->values, "eDgiFmt") && (fields->contains("eDgiFmt") || fields->contains("eDgiMode"));
    // Its input's mode is missing between: what was taken for the input's format is the output's.
    if (has(item.text->values, "eDgoMode") && !fields->contains("eDgiMode") && !fields->contains("eDgoFmt") &&
        get(*fields, "eDgiFmt") == mislabelled)
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

void StatusReport::record_words(std::vector<std::string>& lines) const
{
    if (m_record.contains("ucMode"))
    {
        std::string line = "mixer format " + words_of(m_record, "ucMode");
        if (m_record.contains("ucVfreq"))
        {
            const auto type = number_of(get(m_record, "ucTvType"));
            const std::string_view name = board::names::name_of(board::names::Family::TvType, type.value_or(-1));
            line += " at " + get(m_record, "ucVfreq") + " Hz, TV type " +
                    (name.empty() ? get(m_record, "ucTvType") : std::string(name.substr(name.rfind('_') + 1)));
        }
        if (m_record.contains("fgSetModeCalled"))
            line += get(m_record, "fgSetModeCalled") == "0" ? "; no mode was set since the reset"
                                                            : "; set by a mode setting";
        lines.push_back(line);
    }
    if (m_record.contains("eMasterColorSpace") || m_record.contains("eColorSpace"))
        lines.push_back("master colour space " +
                        words_of(m_record, m_record.contains("eColorSpace") ? "eColorSpace" : "eMasterColorSpace"));
    if (m_record.contains("E"))
    {
        lines.push_back("E(" + get(m_record, "E") +
                        ") is the digital port's bus width; the report does not show the "
                        "master enable");
        lines.push_back("digital port: switch " + on_off(get(m_record, "ucDigitalOut")) + ", " +
                        get(m_record, "ucDigitalBit") + " bits, phase " + get(m_record, "u4Phase") +
                        ", proprietary mode " + get(m_record, "ucProprietaryMode"));
    }
    if (const auto word = number_of(get(m_record, "u4Capability")))
    {
        for (const std::string& line : capability_words(static_cast<std::uint32_t>(*word)))
            lines.push_back(line);
    }
    if (m_record.contains("rDrvExtScl"))
        lines.push_back("external chip " + get(m_record, "rDrvExtScl"));
    else if (!m_external_line && m_ports.back().contains("eSrcColorSpace") && !m_outputs.front().empty())
        lines.push_back("external chip: no line, so DRV_RX_BYPASS_TX or a value without a name");
    if (m_record.contains("fgForceMode"))
        lines.push_back("force mode " + on_off(get(m_record, "fgForceMode")) + "; digest view " +
                        on_off(get(m_record, "fgDigestEnable")) + ", its ratio " + words_of(m_record, "u4DigestAsp"));
    if (m_record.contains("fgOSD5"))
        lines.push_back("fifth OSD plane " + get(m_record, "fgOSD5"));
}

void StatusReport::picture_words(std::vector<std::string>& lines) const
{
    if (m_record.contains("ucBrightness"))
    {
        constexpr std::string_view formats[] = { "YCbCr 4:4:4", "RGB", "xvYCC", "YCbCr 4:2:2", "full-range RGB" };
        const auto format = static_cast<std::size_t>(number_of(get(m_record, "ucDigitalRgb")).value_or(-1));
        lines.push_back("digital colour format " +
                        (format < std::size(formats) ? std::string(formats[format]) : get(m_record, "ucDigitalRgb")) +
                        ", gamma " + (get(m_record, "ucGamma") == "0" ? "off" : "curve " + get(m_record, "ucGamma")));
        lines.push_back("brightness " + get(m_record, "ucBrightness") + ", contrast " + get(m_record, "ucContrast") +
                        ", hue " + get(m_record, "ucHue") + ", saturation " + get(m_record, "ucSaturation") +
                        "; black level: component " + get(m_record, "ucCAVBlackLv") + ", composite " +
                        get(m_record, "ucCVBSBlackLv"));
    }
    if (const auto colour = number_of(get(m_record, "u4BgColor")))
    {
        const auto yuv = static_cast<std::uint32_t>(*colour);
        lines.push_back("colour bar " + on_off(get(m_record, "ucCBEnable")) + ", mute " +
                        on_off(get(m_record, "ucMuteEnable")) + ", sharpness " + get(m_record, "ucSharpness") +
                        ", background Y " + std::to_string(yuv >> 16 & 0xFF) + " U " + std::to_string(yuv >> 8 & 0xFF) +
                        " V " + std::to_string(yuv & 0xFF));
        const bool waits = get(m_record, "fgAspNext") != "0";
        lines.push_back("aspect ratio " + words_of(m_record, "u4AspectRatio") +
                        (waits ? "; " + words_of(m_record, "u4AspNext") + " waits for the next mode change" : ""));
    }
    if (m_record.contains("ucCavSyncLvl") && m_record.contains("ucCvbsYLvl") &&
        !all_zero(m_record, { "ucCavYcInputDelay", "ucCavYcOutputDelay", "ucCvbsYcInputDelay", "ucCvbsYcOutputDelay",
                              "ucCavSyncLvl", "ucCvbsSyncLvl", "ucCvbsBurstLvl", "ucCavYLvl", "ucCvbsYLvl" }))
        lines.push_back("delays in and out: component " + get(m_record, "ucCavYcInputDelay") + ", " +
                        get(m_record, "ucCavYcOutputDelay") + "; composite " + get(m_record, "ucCvbsYcInputDelay") +
                        ", " + get(m_record, "ucCvbsYcOutputDelay") + "; levels of sync and luma: component " +
                        get(m_record, "ucCavSyncLvl") + ", " + get(m_record, "ucCavYLvl") + "; composite " +
                        get(m_record, "ucCvbsSyncLvl") + ", " + get(m_record, "ucCvbsYLvl") + ", burst " +
                        get(m_record, "ucCvbsBurstLvl"));
}

void StatusReport::order_words(std::vector<std::string>& lines) const
{
    if (!m_order.empty())
    {
        std::string line = "planes at positions 0 to 7:";
        for (std::size_t i = 0; i < positions; ++i)
            line += " " + get(m_order, std::to_string(i));
        lines.push_back(line);
    }
    if (m_record.contains("u4PlaneOrder"))
        lines.push_back("packed order 0x" + words_of(m_record, "u4PlaneOrder") + ": planes 1 to 8 show sources " +
                        packed_order_words(get(m_record, "u4PlaneOrder")));
}

void StatusReport::port_words(std::vector<std::string>& lines) const
{
    std::string idle;
    for (std::size_t i = 0; i < ports; ++i)
    {
        const Fields& port = m_ports[i];
        if (port.empty())
            continue;
        if (get(port, "fgConnected") == "0" && get(port, "fgEnabled") == "0")
        {
            idle += (idle.empty() ? "" : ", ") + std::to_string(i);
            continue;
        }
        std::string line = "port " + std::to_string(i) + ": ";
        if (get(port, "fgConnected") == "?")
            line += "source unknown";
        else if (get(port, "fgConnected") == "0")
            line += "not connected";
        else
            line += words_of(port, "u2CompType") + " " + get(port, "u2CompId") + " connected";
        line += get(port, "fgEnabled") == "?" ? "" : get(port, "fgEnabled") == "0" ? ", idle" : ", delivers pictures";
        if (port.contains("eSrcColorSpace"))
            line += ", source " + words_of(port, "eSrcColorSpace") + " (labelled eMasterColorSpace)";
        if (port.contains("eInputColorMode"))
            line += get(port, "eInputColorMode").ends_with("RGB") ? ", RGB" : ", YCbCr";
        if (port.contains("ucLumaKey") && get(port, "ucLumaKey") != "0")
            line += ", luma key " + get(port, "ucLumaKey");
        lines.push_back(line);
    }
    if (!idle.empty())
        lines.push_back("ports neither connected nor delivering: " + idle);
}

std::string StatusReport::output_mode_words(const Fields& output) const
{
    if (!output.contains("eReportedMode"))
    {
        const bool left_out = output.contains("u4VFreq") && output.contains("eDgiFmt");
        return left_out ? "mode above 41, which has no line" : "mode not in the log";
    }
    const std::string printed = get(output, "eReportedMode");
    const std::string_view meant = reported_mode(printed);
    return mode_words(meant) + (meant == printed ? "" : " (reported as " + printed + ")");
}

void StatusReport::output_words(std::vector<std::string>& lines) const
{
    for (std::size_t i = 0; i < outputs; ++i)
    {
        const Fields& output = m_outputs[i];
        if (output.empty())
            continue;
        std::string line = "output " + std::string(output_names[i]) + ": " + on_off(get(output, "fgOutputEnable")) +
                           ", " + output_mode_words(output);
        if (output.contains("u4VFreq"))
            line += ", " + get(output, "u4VFreq") + " Hz";
        for (const auto& [mode, format, what] :
             { std::tuple{ "eDgiMode", "eDgiFmt", "input" }, std::tuple{ "eDgoMode", "eDgoFmt", "output" } })
        {
            if (get(output, mode, "CCIR_INVALID") != "CCIR_INVALID" ||
                get(output, format, "CCIR_NON_USED") != "CCIR_NON_USED")
                line += std::string(", digital ") + what + " " + get(output, mode) + " " + get(output, format);
        }
        if (get(output, "eDgoFmt") == mislabelled)
            line += " (the output's format, labelled as the input's)";
        lines.push_back(line);
    }
}

std::vector<std::string> StatusReport::words() const
{
    std::vector<std::string> lines;
    record_words(lines);
    picture_words(lines);
    order_words(lines);
    port_words(lines);
    output_words(lines);
    return lines;
}

board::Value StatusReport::value() const
{
    const auto value_of = [](const Fields& fields) {
        board::Value value = board::Value::record({});
        for (const auto& [name, printed] : fields)
        {
            if (name == "E" || name == "eColorSpace")
                continue; // the bus width and the master colour space once more
            const auto number = number_of(printed, name == "u4PlaneOrder" ? 16 : 10);
            if (name == "eReportedMode")
                value.add("eResMode", board::Value::text(std::string(reported_mode(printed))));
            else if (name == "u4Capability" || name == "u4BgColor" || name == "u4PlaneOrder")
                value.add(name, board::Value::number(static_cast<std::uint32_t>(number.value_or(0))));
            else
                value.add(name, number ? board::Value::number(*number) : board::Value::text(printed));
        }
        return value;
    };
    const auto list_of = [&](const auto& groups) {
        std::vector<board::Value> list;
        for (std::size_t i = 0; i < groups.size(); ++i)
        {
            if (groups[i].empty())
                continue;
            list.push_back(value_of(groups[i]));
            list.back().add("index", board::Value::number(static_cast<std::int64_t>(i)));
        }
        return board::Value::list(std::move(list));
    };
    board::Value report = value_of(m_record);
    report.add("aucPlaneOrder", value_of(m_order));
    report.add("arPortInfo", list_of(m_ports));
    report.add("arOutputConf", list_of(m_outputs));
    return report;
}

} // namespace pmxboard::decode
