// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/reasons.h"

#include <algorithm>
#include <limits>
#include <map>

#include "drv_if_pmx.h"
#include "tools/pmxboard/decode/knowledge.h"
#include "tools/pmxboard/decode/words.h"
#include "tools/record_view/mode_table.h"

namespace pmxboard::decode
{
namespace
{

using Value = std::optional<std::uint32_t>;
using ValueOf = Value (*)(const Item& item, const CallSoFar& call);
using Holds = bool (*)(const Item& item, const CallSoFar& call);

/** The name of a value, as an argument of a template. */
template <std::size_t size>
struct Name
{
    constexpr Name(const char (&name)[size]) { std::copy(name, name + size, text); } // NOLINT: a literal becomes it
    char text[size]{};
};

/** Of a line that something foreign broke in two the values may be of something else. */
bool is_in_one_piece(const Item& item)
{
    return item.line == item.last_line;
}

/** A number that the layer can have printed. */
Value number_in(const Item& item, std::string_view name)
{
    const auto number = is_in_one_piece(item) ? item.number(name) : std::nullopt;
    const bool fits = number && *number >= 0 && *number <= std::numeric_limits<std::uint32_t>::max();
    return fits ? Value(static_cast<std::uint32_t>(*number)) : std::nullopt;
}

template <Name name>
Value printed(const Item& item, const CallSoFar&)
{
    return number_in(item, name.text);
}

template <Name name>
Value low_byte(const Item& item, const CallSoFar& call)
{
    const Value number = printed<name>(item, call);
    return number ? Value(*number & 0xFF) : std::nullopt;
}

template <std::uint32_t number>
Value always(const Item&, const CallSoFar&)
{
    return number;
}

Value unknown(const Item&, const CallSoFar&)
{
    return {};
}

/** The bit on which a picture setting hangs. */
template <Name feature>
Value bit(const Item&, const CallSoFar&)
{
    for (const auto& [number, name] : record_view::capability_features())
    {
        if (name == feature.text)
            return number;
    }
    return {};
}

std::optional<record_view::ModeRow> format_row(const CallSoFar& call)
{
    return call.format() ? std::optional(record_view::mode_row(*call.format())) : std::nullopt;
}

Value bit_of_format(const Item&, const CallSoFar& call)
{
    const auto row = format_row(call);
    return row ? Value(row->capability) : std::nullopt;
}

Value format(const Item&, const CallSoFar& call)
{
    return call.format();
}

Value deciding_output(const Item&, const CallSoFar& call)
{
    return call.deciding_output();
}

Value osd_port(const Item& item, const CallSoFar& call)
{
    constexpr std::uint32_t first = 2;
    const Value plane = printed<"ucOsdId">(item, call);
    return plane ? Value(first + *plane) : std::nullopt;
}

Value colour_space_before(const Item&, const CallSoFar& call)
{
    return call.value_before("Mode(%d), eMixerOutCS", "eColorSpace");
}

Value source_of_both(const Item& item, const CallSoFar& call)
{
    const Value one = call.source_of_plane(number_in(item, "i"));
    return one == call.source_of_plane(number_in(item, "j")) ? one : std::nullopt;
}

Value both_planes(const Item& item, const CallSoFar&)
{
    const Value one = number_in(item, "i");
    const Value other = number_in(item, "j");
    return one && other ? Value(*one << 4 | *other) : std::nullopt;
}

template <Name name, std::int64_t number>
bool is(const Item& item, const CallSoFar&)
{
    return is_in_one_piece(item) && item.number(name.text) == number;
}

bool has_no_standard(const Item& item, const CallSoFar&)
{
    const auto mode = number_in(item, "ucMode");
    return mode && record_view::mode_row(*mode).colour == record_view::ColourGroup::None;
}

bool is_none_to_start_with(const Item& item, const CallSoFar&)
{
    const auto mode = number_in(item, "ucMode");
    return mode && !record_view::mode_row(*mode).boot;
}

bool is_never_admitted(const Item&, const CallSoFar& call)
{
    const auto row = format_row(call);
    return row && row->is_never_allowed;
}

bool hangs_on_a_bit(const Item&, const CallSoFar& call)
{
    const auto row = format_row(call);
    return row && row->capability;
}

bool goes_behind_a_return(const Item& item, const CallSoFar& call)
{
    return item.value("fgPmxEnabeOsdFlag") == "0" && call.is_behind("PMX_SetOsdEnable.");
}

/** One-mode setting sets up colours when it programs a mode, and only then. */
bool sets_one_mode(const Item&, const CallSoFar& call)
{
    return call.operation() == "PMX_SetMode";
}

/** Which output a line of a request is of. */
Value output_of(const Text& text)
{
    constexpr std::string_view begins[] = { "CCIR(%d, %s)", "HDMI(%d, %s)", "CAV (%d, %s)", "CVBS(%d, %s)" };
    static_assert(PMX_OUTPUT_CCIR == 0 && PMX_OUTPUT_HDMI == 1 && PMX_OUTPUT_CAV == 2 && PMX_OUTPUT_CVBS == 3);
    for (std::uint32_t output = 0; output < std::size(begins); ++output)
    {
        if (text.format.starts_with(begins[output]))
            return output;
    }
    return {};
}

bool decides(const Item& item, const CallSoFar& call)
{
    return call.deciding_output() && call.deciding_output() == output_of(*item.text);
}

/** A reason that a line determines: the text by its beginning, the values, and when it does so. */
struct Row
{
    PMX_REASON_T reason;
    std::string_view text;
    ValueOf a = unknown;
    ValueOf b = unknown;
    Holds holds = nullptr;
};

bool tells_format(const Row& row)
{
    return row.a == format || row.b == format;
}

constexpr std::uint32_t wait_ms = static_cast<std::uint32_t>(timer_seconds * 1000);

// docs/reasons.md lists them, written from these rows.
// clang-format off
constexpr Row reason_rows[] = {
    { PMX_REASON_MODE_NEVER, "[PMX] PMX_SetModeEx, PMX_CheckCap error", format, unknown, is_never_admitted },
    { PMX_REASON_MODE_BIT, "[PMX] PMX_SetModeEx, PMX_CheckCap error", bit_of_format, unknown, hangs_on_a_bit },
    { PMX_REASON_FEATURE_BIT, "[PMX] Seting Brightness fail", bit<"brightness"> },
    { PMX_REASON_FEATURE_BIT, "[PMX] Seting Contrast fail", bit<"contrast"> },
    { PMX_REASON_FEATURE_BIT, "[PMX] Seting Hue fail", bit<"hue"> },
    { PMX_REASON_FEATURE_BIT, "[PMX] Seting Saturation fail", bit<"saturation"> },
    { PMX_REASON_FEATURE_BIT, "[PMX] Seting Sharpness fail", bit<"sharpness"> },
    { PMX_REASON_NO_PORT, "COMP ID to LOCAL ID Fail", printed<"u2CompType">, printed<"u2CompId"> },
    { PMX_REASON_SOURCE_TWICE, "Plane[%d] and Plane[%d] connect", source_of_both, both_planes },
    { PMX_REASON_NO_VIDEO_PLANE, "Invalid VDP Id" },
    { PMX_REASON_COLOUR_SPACE, "Invalid Color Space Id", colour_space_before },
    { PMX_REASON_NO_STANDARD, "Mode(%d), eMixerOutCS", printed<"ucMode">, unknown, has_no_standard },
    { PMX_REASON_NO_TABLE, "Query VDP Interface Fail", always<PMX_COMP_TYPE_VDP> },
    { PMX_REASON_NOT_REGISTERED, "Fail to register IID_IPMX" },
    { PMX_REASON_MUTEX_STAYS, "i4PMX_Uninit return", unknown, unknown, is<"i4Ret", -1> },
    { PMX_REASON_FORMAT_FROM_OUTPUT, "CCIR(%d, %s)", deciding_output, format, decides },
    { PMX_REASON_FORMAT_FROM_OUTPUT, "HDMI(%d, %s)", deciding_output, format, decides },
    { PMX_REASON_FORMAT_FROM_OUTPUT, "CAV (%d, %s)", deciding_output, format, decides },
    { PMX_REASON_FORMAT_FROM_OUTPUT, "CVBS(%d, %s)", deciding_output, format, decides },
    { PMX_REASON_FORMAT_FROM_OFF, "[PMX] Warning: Disable All output", low_byte<"ucMode"> },
    { PMX_REASON_FULL_CHANGE, "PMX Start to set OSD Display mode", printed<"ucMode"> },
    { PMX_REASON_FULL_CHANGE, "Mode(%d), eMixerOutCS", printed<"ucMode">, unknown, sets_one_mode },
    { PMX_REASON_SAME_FORMAT, "[PMX] fgHdmiExist", always<0>, unknown, is<"fgHdmiExist", 0> },
    { PMX_REASON_NO_SINK, "[PMX] fgHdmiExist", unknown, unknown, is<"fgHdmiExist", 1> },
    { PMX_REASON_HELD_BACK, "[PMX] VDP_SetClearVideo", always<wait_ms> },
    { PMX_REASON_TIMED_OUT, "PMX timeout" },
    { PMX_REASON_MIXED_AGAIN, "Set Osd Enable", unknown, unknown, goes_behind_a_return },
    { PMX_REASON_MASTER_FROM_PORT, "[PMX] VDP_COMP_1 enabled", printed<"eColorSpace">, always<0> },
    { PMX_REASON_MASTER_FROM_PORT, "[PMX] VDP_COMP_2 enabled", printed<"eColorSpace">, always<1> },
    { PMX_REASON_MASTER_FROM_PORT, "[PMX] Gfx enabled", printed<"eColorSpace"> },
    { PMX_REASON_MASTER_FROM_PORT, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_601", always<0>, osd_port },
    { PMX_REASON_MASTER_FROM_PORT, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709", always<1>, osd_port },
    { PMX_REASON_MASTER_CHANGES, "[PMX] Master Color Space change", printed<"eColorSpace">, printed<"eNewColorSpace"> },
    { PMX_REASON_BOOT_MODE, "[PMX]_arPmxConf[ucPmxId].ucMode=", printed<"ucMode">, unknown, is_none_to_start_with },
    { PMX_REASON_NO_TIMER, "x_timer_stop(_arPmxDispPartStatus.hPMXTimer)" },
    { PMX_REASON_NO_TIMER, "x_timer_start(_arPmxDispPartStatus.hPMXTimer" },
};
// clang-format on

using RowsByText = std::multimap<const Text*, const Row*>;

RowsByText collect_rows()
{
    RowsByText found;
    for (const Row& row : reason_rows)
    {
        for (const Text& text : texts())
        {
            if (text.format.starts_with(row.text))
                found.emplace(&text, &row);
        }
    }
    return found;
}

/** The number of a mode whose name the layer prints; nothing when several share it, or none has one. */
Value mode_called(const std::string& printed)
{
    Value found;
    for (const record_view::ModeRow& row : record_view::mode_rows())
    {
        if (row.printed_name != printed)
            continue;
        if (found)
            return {};
        found = row.number;
    }
    return found;
}

/** What is printed of a mode, as it is read behind that word. */
std::string words_behind_mode(const std::string& printed)
{
    return printed == "(null)" ? "without a name (4K)" : mode_words(printed);
}

} // namespace

std::optional<std::uint32_t> CallSoFar::value_before(std::string_view text, std::string_view name) const
{
    if (!is_behind(text))
        return {};
    return number_in(*m_before, name);
}

std::optional<std::uint32_t> CallSoFar::source_of_plane(std::optional<std::uint32_t> plane) const
{
    return plane && *plane < m_sources.size() ? m_sources.at(*plane) : std::nullopt;
}

void CallSoFar::take_output(const Item& item)
{
    const Value output = output_of(*item.text);
    if (output && !m_decider && *output == m_outputs)
    {
        if (item.value("fgOutputEnable") != "0")
        {
            m_decider = output;
            m_format = mode_called(item.value("eResMode"));
            m_format_words = words_behind_mode(item.value("eResMode"));
        }
        ++m_outputs;
    }
    if (item.text->format.starts_with("[PMX] Warning: Disable All output"))
        m_format = low_byte<"ucMode">(item, *this);
}

void CallSoFar::take_source(const Item& item)
{
    const Value plane = number_in(item, "i");
    const Value source = number_in(item, "u1PlnSel");
    if (plane && source && *plane < m_sources.size())
        m_sources.at(*plane) = source;
}

std::vector<Determined> CallSoFar::take(const Item& item)
{
    static const RowsByText by_text = collect_rows();
    take_output(item);
    take_source(item);
    std::vector<Determined> determined;
    const auto [begin, end] = by_text.equal_range(item.text);
    for (auto row = begin; row != end; ++row)
    {
        const auto& [reason, text, a, b, holds] = *row->second;
        if (holds == nullptr || holds(item, *this))
            determined.push_back({ reason,
                                   { a(item, *this), b(item, *this) },
                                   tells_format(*row->second) ? format_words() : "?",
                                   item.line });
    }
    m_before = &item;
    return determined;
}

} // namespace pmxboard::decode
