// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/prompt/about_mode.h"

#include <cstdarg>
#include <cstdio>
#include <utility>

#include "tools/pmxboard/functions/mode_names.h"

namespace pmxboard
{
namespace
{

using board::Value;
using record_view::ColourGroup;
using record_view::ModeRow;

__attribute__((format(printf, 1, 2))) std::string formatted(const char* format, ...)
{
    char text[160];
    va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    return text;
}

std::string capability_text(const ModeRow& mode)
{
    return mode.is_always_allowed  ? "always"
           : mode.is_never_allowed ? "never"
                                   : std::to_string(mode.capability.value_or(0));
}

const char* short_colour(ColourGroup group)
{
    return group == ColourGroup::Sd ? "SD" : group == ColourGroup::Hd ? "HD" : "-";
}

std::string size_text(const ModeRow& mode)
{
    return std::to_string(mode.width) + "x" + std::to_string(mode.height);
}

std::string refresh_text(const ModeRow& mode)
{
    const std::string refresh = refresh_of(mode.name);
    return refresh.empty() ? "-" : refresh;
}

Value number(unsigned value)
{
    return Value::number(value);
}

} // namespace

std::string mode_table_text(const std::vector<ModeRow>& modes, const Look& look)
{
    std::string text =
        look.bold(" no mode                           size     Hz prg HD tve    cap CS bar pll boot") + "\n";
    for (const ModeRow& mode : modes)
        text += formatted("%3u %-25s %9s %6s %3s %2s %3s %6s %2s %3u %3s %4s\n", mode.number,
                          std::string(mode.name).c_str(), size_text(mode).c_str(), refresh_text(mode).c_str(),
                          mode.is_progressive ? "yes" : "-", mode.is_hd_out ? "HD" : "-", mode.is_tve_hd ? "HD" : "-",
                          capability_text(mode).c_str(), short_colour(mode.colour), mode.colour_bar,
                          mode.pll_60 ? "60" : "50", mode.boot ? std::to_string(*mode.boot).c_str() : "-");
    return text;
}

std::string mode_text(const ModeRow& mode, const Look& look)
{
    const auto yes_or_no = [](bool is) { return std::string(is ? "yes" : "no"); };
    const std::string title = mode.name.empty() ? "no mode has the number " + std::to_string(mode.number)
                                                : std::string(mode.name) + " (" + std::to_string(mode.number) + ")";
    const std::pair<const char*, std::string> lines[] = {
        { "size", std::to_string(mode.width) + " x " + std::to_string(mode.height) },
        { "refresh", refresh_of(mode.name).empty() ? "its name does not tell" : refresh_of(mode.name) + " Hz" },
        { "reported progressive", yes_or_no(mode.is_progressive) },
        { "reported HD output", yes_or_no(mode.is_hd_out) },
        { "HD for the TV encoders", yes_or_no(mode.is_tve_hd) },
        { "admitted", mode.capability ? "by capability bit " + std::to_string(*mode.capability)
                                      : capability_text(mode) + ", whatever the capability word says" },
        { "colour group", mode.colour == ColourGroup::Sd   ? "SD, BT.601"
                          : mode.colour == ColourGroup::Hd ? "HD, BT.709"
                                                           : "none: the converters are left alone" },
        { "colour-bar width", std::to_string(mode.colour_bar) },
        { "video PLL", mode.pll_60 ? "the word of the 60 Hz family" : "the word of 50 Hz and 24 Hz" },
        { "from the boot loader", mode.boot ? "yes, " + std::to_string(*mode.boot) + " Hz TV type" : "not accepted" },
        { "printed as", mode.printed_name ? std::string(*mode.printed_name) : "(null)" },
    };
    std::string text = look.bold(title) + "\n";
    if (!mode.has_row)
        text += "  has no row of its own; every such number is treated alike:\n";
    for (const auto& [label, value] : lines)
        text += formatted("  %-23s ", label) + value + "\n";
    std::string flags;
    for (const std::string_view flag : mode.flags)
        flags.append(flags.empty() ? "" : " ").append(flag);
    return text + wrapped("flags                   " + (flags.empty() ? "none" : flags), look.width, 2, 26);
}

Value json_of(const ModeRow& mode)
{
    std::vector<Value> flags;
    for (const std::string_view flag : mode.flags)
        flags.push_back(Value::text(std::string(flag)));
    Value record;
    record.add("number", number(mode.number))
        .add("name", mode.name.empty() ? Value::null() : Value::text(std::string(mode.name)))
        .add("has_row", number(mode.has_row))
        .add("width", number(mode.width))
        .add("height", number(mode.height))
        .add("refresh", refresh_of(mode.name).empty() ? Value::null() : Value::text(refresh_of(mode.name)))
        .add("progressive", number(mode.is_progressive))
        .add("hd_output", number(mode.is_hd_out))
        .add("tv_encoder_hd", number(mode.is_tve_hd))
        .add("admitted", Value::text(mode.capability ? "by capability bit" : capability_text(mode)))
        .add("capability_bit", mode.capability ? number(*mode.capability) : Value::null())
        .add("colour_group", Value::text(mode.colour == ColourGroup::None ? "none" : short_colour(mode.colour)))
        .add("colour_bar_width", number(mode.colour_bar))
        .add("pll_family", number(mode.pll_60 ? 60 : 50))
        .add("boot_family", mode.boot ? number(*mode.boot) : Value::null())
        .add("printed_name", mode.printed_name ? Value::text(std::string(*mode.printed_name)) : Value::null())
        .add("flags", Value::list(std::move(flags)));
    return record;
}

} // namespace pmxboard
