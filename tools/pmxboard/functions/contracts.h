// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the headers promise about the functions of the layer and of the platform.
 *  The table is written when the tool is built. */
#pragma once

#include <string_view>
#include <vector>

namespace pmxboard
{

struct ContractParameter
{
    std::string_view name;
    std::string_view text;
    std::string_view direction; ///< of a pointer: "in", "out" or "in,out"
    std::string_view behind;    ///< what the pointer leads to, as the header writes it; empty: one object of its type
};

struct Contract
{
    std::string_view name;
    std::string_view declaration; ///< without the semicolon
    std::string_view header;
    std::string_view section; ///< the group of the header that it stands in; may be empty
    std::string_view brief;
    std::string_view result;  ///< empty for a function without one
    std::string_view context; ///< from where it may be called; empty where the header says it for all
    std::vector<ContractParameter> parameters;
};

/** The layer's functions, then those of the platform, each in the order of their headers. */
const std::vector<Contract>& contracts();

/** Null pointer when no header declares it. */
const Contract* contract_of(std::string_view function);

/** What a header says of a field. */
struct FieldText
{
    std::string_view record;
    std::string_view field;
    std::string_view text;
};
const std::vector<FieldText>& field_texts();
/** Empty when the header says nothing of it. */
std::string_view text_of_field(std::string_view record, std::string_view field);

/** The first sentence of a text, without its full stop. */
std::string_view first_sentence(std::string_view text);

} // namespace pmxboard
