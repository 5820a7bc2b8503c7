// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/words.h"

#include <algorithm>
#include <cstdio>
#include <map>
#include <regex>

#include "board/names.h"
#include "tools/record_view/mode_table.h"

namespace pmxboard::decode
{
namespace
{

using board::names::Family;

constexpr const char* unknown_value = "?";

/** `60`, `23_976`, and `23976` as the 4K mode has it. */
std::string frequency_words(std::string written)
{
    std::replace(written.begin(), written.end(), '_', '.');
    return (written == "23976" ? "23.976" : written) + " Hz";
}

/** A mode's name without RES_, in words; empty when it is not made like one. */
std::string named_mode_words(const std::string& name)
{
    static const std::regex shape("(?:([23]D)_)?(?:(640x480).*|(4K2K)([0-9_]+)HZ|([0-9]+)([IP])(?:([0-9_]+)HZ)?)"
                                  "(_TB|_SBS_HALF|_1440|_2880|_4096)?");
    static const std::map<std::string, std::string> ends = { { "_TB", ", top and bottom" },
                                                             { "_SBS_HALF", ", side by side" },
                                                             { "_1440", ", 1440 samples a line" },
                                                             { "_2880", ", 2880 samples a line" },
                                                             { "_4096", ", 4096 wide" } };
    std::smatch part;
    if (!std::regex_match(name, part, shape))
        return {};
    std::string words = part[1].matched ? part.str(1) + " " : "";
    if (part[2].matched)
        return words + part.str(2);
    if (part[3].matched)
        return words + part.str(3) + " " + frequency_words(part.str(4));
    words += part.str(5) + (part.str(6) == "I" ? "i" : "p");
    if (part[7].matched)
        words += " " + frequency_words(part.str(7));
    return part[8].matched ? words + ends.at(part.str(8)) : words;
}

std::string reported_mode_words(const std::string& printed)
{
    return mode_words(std::string(reported_mode(printed)));
}

std::string hex_words(const std::string& printed)
{
    return std::string(8 - std::min<std::size_t>(printed.size(), 8), '0') + printed;
}

/** What feeds each plane in a packed order, plane 1 first: `0 1 2 3 4 5 6 7`. */
std::string sources_words(const std::string& hex)
{
    const auto order = static_cast<std::uint32_t>(number_of(hex, 16).value_or(0));
    std::vector<std::string> sources;
    for (unsigned plane = 0; plane < 8; ++plane)
        sources.push_back(std::to_string(order >> (4 * plane) & 7));
    return joined(sources, " ");
}

std::string yuv_words(const std::string& printed)
{
    const auto yuv = static_cast<std::uint32_t>(number_of(printed).value_or(0));
    return "Y " + std::to_string(yuv >> 16 & 0xFF) + " U " + std::to_string(yuv >> 8 & 0xFF) + " V " +
           std::to_string(yuv & 0xFF);
}

/** How values of some names are said: as the family names them, and that as it stands in the list, where * is any
 *  other. What a list cannot say, a function does. */
struct ValueWords
{
    std::string_view names;
    Family family = Family::None;
    std::string_view list = {};
    std::string (*function)(const std::string& printed) = nullptr;
};

// The names without a prefix stand in sentences alone.
constexpr ValueWords value_table[] = {
    { "ucMode,eResMode", Family::None, {}, mode_words },
    { "eReportedMode", Family::None, {}, reported_mode_words },
    { "u4PlaneOrder,u4Hardware,u4TestData", Family::None, {}, hex_words },
    { "sources", Family::None, {}, sources_words },
    { "yuv", Family::None, {}, yuv_words },
    { "eColorSpace,eNewColorSpace,eMasterColorSpace,eSrcColorSpace", Family::ColorSpace,
      "DRV_PMX_CS_YCBCR_601=BT.601,DRV_PMX_CS_YCBCR_709=BT.709,DRV_PMX_CS_RGB=RGB,*=colour space *" },
    { "u2CompType", Family::ComponentType, "PMX_COMP_TYPE_VDP=video plane,PMX_COMP_TYPE_OSD=OSD plane,*=of type *" },
    { "standard", Family::TvType, "PMX_TV_TYPE_NTSC=NTSC,PMX_TV_TYPE_PAL=PAL" },
    { "u4AspectRatio,u4AspNext,u4DigestAsp", Family::Aspect },
    { "eDgoMode,eDgiMode", Family::CcirMode },
    { "eDgoFmt,eDgiFmt", Family::CcirFormat },
    { "fgEnable,fgDigestEnable,ucCAVEn,ucCVBSEn,switch", Family::None, "0=off,1=on,*=on (*)" },
    { "port", Family::None, "8=no port (8): refused,*=port *" },
    { "bSetTVE", Family::None, "0=HDMI,*=the analogue outputs" },
    { "fgApplyOnNext", Family::None, "0=now,*=at the next mode change" },
    { "format", Family::None, "0=YCbCr 4:4:4,1=RGB,2=xvYCC,3=YCbCr 4:2:2,4=full-range RGB" },
    { "called", Family::None, "0=no mode was set since the reset,*=set by a mode setting" },
    { "gamma", Family::None, "0=off,*=curve *" },
};

std::string named(Family family, const std::string& printed)
{
    const auto number = number_of(printed);
    const std::string_view name = number ? board::names::name_of(family, *number) : std::string_view();
    return name.empty() ? printed : std::string(name);
}

/** A value as a list says it. */
std::string listed(std::string_view list, const std::string& value)
{
    for (const std::string_view item : split(list))
    {
        const std::size_t equals = item.find('=');
        if (item.substr(0, equals) != value && !item.starts_with('*'))
            continue;
        std::string words(item.substr(equals + 1));
        const std::size_t place = words.find('*');
        return place == words.npos ? words : words.replace(place, 1, value);
    }
    return value;
}

using Bits = std::map<unsigned, std::string>;

/** What a word admits and refuses of all that hangs on bits. */
std::string bit_words(std::uint32_t word, const Bits& bits, const std::string& every, const std::string& none)
{
    std::vector<std::string> set;
    std::vector<std::string> clear;
    for (const auto& [bit, name] : bits)
        ((word >> bit & 1) != 0 ? set : clear).push_back(name);
    if (clear.empty())
        return "admits " + every;
    return "admits " + (set.empty() ? none : joined(set, ", ") + "; refuses " + joined(clear, ", "));
}

/** The modes that hang on each bit: `720p 60 Hz (and 3D 720p 60 Hz, top and bottom)`. */
Bits collect_modes_by_bit()
{
    std::map<unsigned, std::vector<std::string>> modes;
    for (const record_view::ModeRow& mode : record_view::mode_rows())
    {
        if (mode.capability)
            modes[*mode.capability].push_back(mode_words(std::string(mode.name)));
    }
    Bits words;
    for (const auto& [bit, names] : modes)
    {
        const std::string others = joined({ names.begin() + 1, names.end() }, ", ");
        words[bit] = others.empty() ? names.front() : names.front() + " (and " + others + ")";
    }
    return words;
}

const Bits& modes_by_bit()
{
    static const Bits words = collect_modes_by_bit(); // the table is constant, and a log may have many reports
    return words;
}

} // namespace

std::string mode_words(const std::string& mode)
{
    if (mode == "(null)")
        return "a mode without a name (4K)";
    const std::string name = named(Family::ResolutionMode, mode);
    if (number_of(name))
        return "mode " + name + " (unknown)";
    if (name == "RES_PANEL_AUO_B089AW01")
        return "panel 1024x600";
    const std::string words = name.starts_with("RES_") ? named_mode_words(name.substr(4)) : "";
    return words.empty() ? name : words;
}

std::string_view reported_mode(std::string_view name)
{
    if (name == "RES_PANEL_AUO_B089AW01")
        return "RES_2D_640x480HZ";
    if (name == "RES_MODE_NUM")
        return "RES_PANEL_AUO_B089AW01";
    return name == "RES_AUTO" ? "RES_3D_720P60HZ_TB" : name;
}

std::string value_words(std::string_view name, const std::string& printed)
{
    const auto row = std::find_if(std::begin(value_table), std::end(value_table),
                                  [name](const ValueWords& one) { return has(one.names, name); });
    if (row == std::end(value_table))
        return printed;
    return row->function != nullptr ? row->function(printed) : listed(row->list, named(row->family, printed));
}

std::string sentence(std::string_view with_names, const std::function<std::string(std::string_view)>& value_of)
{
    std::string said;
    while (!with_names.empty())
    {
        const std::size_t open = std::min(with_names.find('{'), with_names.size());
        const std::size_t close = std::min(with_names.find('}', open), with_names.size());
        said += with_names.substr(0, open);
        if (open < close)
        {
            const std::string_view name = with_names.substr(open + 1, close - open - 1);
            const std::size_t colon = name.find(':');
            const std::string printed = value_of(name.substr(0, colon));
            said += printed == unknown_value ? printed : value_words(name.substr(colon + 1), printed);
        }
        with_names.remove_prefix(std::min(close + 1, with_names.size()));
    }
    return said;
}

std::string tale_of(const Item& item)
{
    return sentence(item.text->tale, [&](std::string_view name) { return item.value(name); });
}

std::vector<std::string> capability_words(std::uint32_t word)
{
    char number[16];
    std::snprintf(number, sizeof number, "0x%08X", word);
    const Bits features = record_view::capability_features();
    std::vector<std::string> names;
    for (const auto& [bit, name] : features)
        names.push_back(name);
    return { "capability " + std::string(number) + ": " +
                 bit_words(word, modes_by_bit(), "every mode that has a bit", "no mode that has a bit"),
             "of the features it " +
                 bit_words(word, features, "every one: " + joined(names, ", "), "no one that has a bit") };
}

std::vector<std::string> printed_names()
{
    std::vector<std::string> names;
    for (const record_view::ModeRow& mode : record_view::mode_rows())
    {
        if (mode.printed_name)
            names.emplace_back(*mode.printed_name);
    }
    // The report's list of modes is older than the modes, and has what ended them then.
    names.insert(names.end(), { "RES_MODE_NUM", "RES_AUTO" });
    for (const Family family :
         { Family::CcirMode, Family::CcirFormat, Family::ExtChipUsage, Family::GfxColorMode, Family::ColorSpace })
    {
        for (std::int64_t number = 0; !board::names::name_of(family, number).empty(); ++number)
            names.emplace_back(board::names::name_of(family, number));
    }
    std::erase(names, "DRV_RX_BYPASS_TX"); // has no line
    return names;
}

std::string_view source_of(const Text& text)
{
    constexpr std::string_view sources[] = { "print", "assertion", "file" };
    return text.level >= 0 ? "log" : sources[level_plain - text.level];
}

std::string joined(const std::vector<std::string>& texts, std::string_view between)
{
    std::string all;
    for (const std::string& text : texts)
        all.append(all.empty() ? "" : between).append(text);
    return all;
}

std::string counted(std::size_t count, std::string_view what)
{
    return std::to_string(count) + " " + std::string(what) + (count == 1 ? "" : "s");
}

} // namespace pmxboard::decode
