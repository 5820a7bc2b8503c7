/** @file
 *  Values of the layer's texts in words. */
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

/** A resolution mode by its number or by the name that the layer prints: `1080p 60 Hz`. */
std::string mode_words(std::string_view mode);

/** A mode as the status report names it, whose names lag the modes from 39 on: the mode that is meant. */
std::string_view reported_mode(std::string_view name);

/** A value of a text in words, found by its name. */
std::string value_words(std::string_view name, const std::string& printed);

/** The sentence of an item's text with its values put in. */
std::string tale_of(const Item& item);

/** The capability word: its number, and what it admits and refuses, by name. */
std::vector<std::string> capability_words(std::uint32_t word);

/** What feeds each plane in a packed order, plane 1 first: `0 1 2 3 4 5 6 7`. */
std::string packed_order_words(std::string_view hex);

/** `1 line`, `2 lines`. */
std::string counted(std::size_t count, std::string_view what);

} // namespace pmxboard::decode
