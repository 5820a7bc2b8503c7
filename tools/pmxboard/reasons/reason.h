// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Why the layer refused or decided: what it told, and how that is said to people and programs. */
#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "board/value.h"
#include "pmx_reason.h"

namespace pmxboard
{

/** A row of the table of reasons. */
struct ReasonRow
{
    PMX_REASON_T number;
    std::string_view name;
    PMX_REASON_CLASS_T class_of;
    std::string_view class_name;
    std::string_view advice; ///< what a caller may do
    std::array<std::string_view, 2> kinds;
    std::string_view sentence; ///< as the layer's own table has it, with places for its values
};

/** All of them, by number. */
std::span<const ReasonRow> reason_rows();
const ReasonRow& row_of(PMX_REASON_T reason);

/** A reason that was given. */
struct Reason
{
    PMX_REASON_T number;
    std::uint32_t a;
    std::uint32_t b;
    std::string file; ///< "src/driver/pmx/pmx_mode.cpp"
    unsigned line;
    std::string function; ///< the one that gave it
};

/** Whether something was not done that was asked for: no decision alone. */
bool is_refusal(const Reason& reason);

/** Of a reason both; what nobody knows is nothing. */
using ReasonValues = std::array<std::optional<std::uint32_t>, 2>;

/** What it means with its values, by their names: "capability bit 9 is clear in 0x7FFBFDFF". */
std::string sentence_of(const Reason& reason);
/** The same, with that for what nobody knows. */
std::string sentence_of(PMX_REASON_T reason, const ReasonValues& values = {}, std::string_view unknown = "?");
/** The same for any values: "capability bit N is clear in WORD". */
std::string general_sentence_of(const ReasonRow& row);
/** "PMX_CheckCap, src/driver/pmx/pmx_mode.cpp:20" */
std::string place_of(const Reason& reason);
/** {id=4, name="MODE_BIT", class="MODE", values=[9, 2147220991], text="…", function="…", place="…"} */
board::Value json_of(const Reason& reason);

/** What the twin has told since it was led in, or since it was last forgotten. */
const std::vector<Reason>& told_reasons();
void forget_told_reasons();
/** Called with each of them when it is told. */
void on_told_reason(std::function<void(const Reason&)> listener);

/** Where an operation, or what it calls, gives a reason. */
struct ReasonPlace
{
    PMX_REASON_T number;
    std::string_view function;
    std::string_view file;
    unsigned line;
    bool own; ///< and not another operation's that it calls on its way
};
/** The reasons that an operation can give, in the order of the sources; of the name of no operation: none. */
std::span<const ReasonPlace> reasons_of(std::string_view operation);

} // namespace pmxboard
