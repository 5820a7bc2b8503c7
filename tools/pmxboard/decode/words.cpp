#include "tools/pmxboard/decode/words.h"

#include <algorithm>
#include <cstdio>

#include "board/names.h"

namespace pmxboard::decode
{
namespace
{

using board::names::Family;

/** `60HZ`, `23_976HZ`, `4K2K24HZ`'s end: the frequency in words; empty for anything else. */
std::string frequency_words(std::string_view text)
{
    if (!text.ends_with("HZ"))
        return {};
    text.remove_suffix(2);
    if (text.empty() || text.find_first_not_of("0123456789_") != text.npos)
        return {};
    std::string words(text);
    std::replace(words.begin(), words.end(), '_', '.');
    if (words == "23976")
        words = "23.976";
    return words + " Hz";
}

/** A mode's name without RES_, in words. */
std::string named_mode_words(std::string_view name)
{
    std::string words;
    std::string behind;
    if (name.starts_with("3D_") || name.starts_with("2D_"))
    {
        words = std::string(name.substr(0, 2)) + " ";
        name.remove_prefix(3);
    }
    for (const auto& [end, meaning] : { std::pair<std::string_view, std::string_view>{ "_TB", ", top and bottom" },
                                        { "_SBS_HALF", ", side by side" },
                                        { "_1440", ", 1440 samples a line" },
                                        { "_2880", ", 2880 samples a line" },
                                        { "_4096", ", 4096 wide" } })
    {
        if (name.ends_with(end))
        {
            name.remove_suffix(end.size());
            behind = meaning;
        }
    }
    if (name.starts_with("640x480"))
        return words + "640x480";
    if (name.starts_with("4K2K"))
        return "4K2K " + frequency_words(name.substr(4));
    const std::size_t digits = std::min(name.find_first_not_of("0123456789"), name.size());
    if (digits == 0 || digits == name.size() || (name[digits] != 'I' && name[digits] != 'P'))
        return {};
    words += std::string(name.substr(0, digits)) + (name[digits] == 'I' ? "i" : "p");
    name.remove_prefix(digits + 1);
    if (name.starts_with("HZ")) // no mode, but it must not become a word
        return {};
    const std::string frequency = frequency_words(name);
    if (frequency.empty() && !name.empty())
        return {};
    return words + (frequency.empty() ? "" : " " + frequency) + behind;
}

std::string named(Family family, const std::string& printed)
{
    const auto number = number_of(printed);
    const std::string_view name = number ? board::names::name_of(family, *number) : std::string_view();
    return name.empty() ? printed : std::string(name);
}

std::string colour_space_words(const std::string& printed)
{
    const std::string name = named(Family::ColorSpace, printed);
    if (name == "DRV_PMX_CS_YCBCR_601")
        return "BT.601";
    if (name == "DRV_PMX_CS_YCBCR_709")
        return "BT.709";
    return name == "DRV_PMX_CS_RGB" ? "RGB" : "colour space " + name;
}

std::string component_words(const std::string& printed)
{
    const std::string name = named(Family::ComponentType, printed);
    if (name == "PMX_COMP_TYPE_VDP")
        return "video plane";
    return name == "PMX_COMP_TYPE_OSD" ? "OSD plane" : "of type " + name;
}

std::string switch_words(const std::string& printed)
{
    return printed == "0" ? "off" : printed == "1" ? "on" : "on (" + printed + ")";
}

std::string hex_word(const std::string& printed)
{
    return std::string(8 - std::min<std::size_t>(printed.size(), 8), '0') + printed;
}

struct CapabilityBit
{
    unsigned bit;
    const char* name;
};

constexpr CapabilityBit modes[] = {
    { 0, "480i (and 2D 480i 60 Hz)" },
    { 1, "576i" },
    { 2, "480p" },
    { 3, "576p" },
    { 4, "720p 60 Hz (and its top-and-bottom mode)" },
    { 5, "720p 50 Hz (and its top-and-bottom mode)" },
    { 6, "1080i 60 Hz (and its side-by-side mode)" },
    { 7, "1080i 50 Hz (and its side-by-side mode)" },
    { 8, "1080p 60 Hz" },
    { 9, "1080p 50 Hz" },
    { 10, "1080p 30 Hz" },
    { 11, "1080p 25 Hz" },
    { 12, "1080p 24 Hz (and its top-and-bottom mode)" },
    { 13, "1080p 23.976 Hz" },
    { 14, "1080p 29.97 Hz (and the top-and-bottom mode of 23 Hz)" },
    { 15, "all frame-packed 3D modes" },
    { 16, "640x480" },
};

constexpr CapabilityBit features[] = {
    { 20, "gamma" },      { 21, "brightness" },   { 22, "contrast" },  { 23, "hue" },
    { 24, "saturation" }, { 25, "digital port" }, { 27, "sharpness" }, { 30, "black level" },
};

template <std::size_t Count>
std::string bit_words(std::uint32_t word, const CapabilityBit (&bits)[Count], const char* what)
{
    std::string set;
    std::string clear;
    for (const CapabilityBit& bit : bits)
    {
        std::string& list = (word >> bit.bit & 1) != 0 ? set : clear;
        list += (list.empty() ? "" : ", ") + std::string(bit.name);
    }
    if (clear.empty())
        return std::string("admits every ") + what + (Count == std::size(features) ? ": " + set : "");
    if (set.empty())
        return std::string("admits no ") + what + " that has a bit";
    return std::string("admits ") + set + "; refuses " + clear;
}

} // namespace

std::string mode_words(std::string_view mode)
{
    if (mode == "(null)")
        return "a mode without a name (4K)";
    std::string name(mode);
    if (const auto number = number_of(mode))
        name = board::names::name_of(Family::ResolutionMode, *number);
    if (name.empty())
        return "mode " + std::string(mode) + " (unknown)";
    if (name == "RES_PANEL_AUO_B089AW01")
        return "panel 1024x600";
    if (!name.starts_with("RES_"))
        return name;
    const std::string words = named_mode_words(std::string_view(name).substr(4));
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
    if (name == "ucMode" || name == "eResMode")
        return mode_words(printed);
    if (name == "eReportedMode")
        return mode_words(reported_mode(printed));
    if (name.find("ColorSpace") != name.npos)
        return colour_space_words(printed);
    if (name == "u2CompType")
        return component_words(printed);
    if (name == "port")
        return printed == "8" ? "no port (8): refused" : "port " + printed;
    if (name == "bSetTVE")
        return printed == "0" ? "HDMI" : "the analogue outputs";
    if (name == "u4PlaneOrder" || name == "u4Hardware" || name == "u4TestData")
        return hex_word(printed);
    if (name == "fgApplyOnNext")
        return printed == "0" ? "now" : "at the next mode change";
    if (name == "u4AspectRatio" || name == "u4AspNext" || name == "u4DigestAsp")
        return named(Family::Aspect, printed);
    if (name == "eDgoMode" || name == "eDgiMode")
        return named(Family::CcirMode, printed);
    if (name == "eDgoFmt" || name == "eDgiFmt")
        return named(Family::CcirFormat, printed);
    if (name == "fgEnable" || name == "fgDigestEnable" || name == "ucCAVEn" || name == "ucCVBSEn")
        return switch_words(printed);
    return printed;
}

std::string tale_of(const Item& item)
{
    std::string tale;
    std::string_view left = item.text->tale;
    while (!left.empty())
    {
        const std::size_t open = std::min(left.find('{'), left.size());
        tale += left.substr(0, open);
        left.remove_prefix(open);
        if (left.empty())
            break;
        const std::size_t close = left.find('}');
        const std::string_view name = left.substr(1, close - 1);
        tale += value_words(name, item.value(name));
        left.remove_prefix(close + 1);
    }
    return tale;
}

std::vector<std::string> capability_words(std::uint32_t word)
{
    char digits[16];
    std::snprintf(digits, sizeof digits, "0x%08X", word);
    return { "capability " + std::string(digits) + ": " + bit_words(word, modes, "mode that has a bit"),
             "of the features it " + bit_words(word, features, "one") };
}

std::string packed_order_words(std::string_view hex)
{
    const auto order = number_of(hex, 16);
    std::string words;
    for (unsigned plane = 0; order && plane < 8; ++plane)
        words += (plane == 0 ? "" : " ") + std::to_string(*order >> (4 * plane) & 7);
    return words;
}

std::string counted(std::size_t count, std::string_view what)
{
    return std::to_string(count) + " " + std::string(what) + (count == 1 ? "" : "s");
}

} // namespace pmxboard::decode
