// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Values of the layer's texts in words. */
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

/** A resolution mode by its number or by the name that the layer prints: `1080p 60 Hz`. */
std::string mode_words(const std::string& mode);

/** A mode as the status report names it, whose names lag the modes from 39 on: the mode that is meant. */
std::string_view reported_mode(std::string_view name);

/** A value of a text in words, found by its name. */
std::string value_words(std::string_view name, const std::string& printed);

/** A sentence with values put in for {name}, in words; {name:other} has them in the words of another name. An unknown
 *  value is a question mark. */
std::string sentence(std::string_view with_names, const std::function<std::string(std::string_view)>& value_of);

/** The sentence of an item's text with its values put in. */
std::string tale_of(const Item& item);

/** The capability word: its number, and what it admits and refuses, by name. */
std::vector<std::string> capability_words(std::uint32_t word);

/** Every name that the layer prints for a value. */
std::vector<std::string> printed_names();

/** Where a text comes from: `log`, `print`, `assertion` or `file`. */
std::string_view source_of(const Text& text);

/** The texts with something between them. */
std::string joined(const std::vector<std::string>& texts, std::string_view between);

/** `1 line`, `2 lines`. */
std::string counted(std::size_t count, std::string_view what);

} // namespace pmxboard::decode
