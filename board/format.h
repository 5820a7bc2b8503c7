// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a printf format says, for consoles that must survive whatever the stack prints. */
#pragma once

#include <cstdarg>
#include <string>

namespace board
{

struct Formatted
{
    std::string text;
    std::string complaint; ///< a conversion that could not be carried out as it stands; empty when there was none
};

/** The text of a printf format and its values. A null text is (null); a text that cannot be read and %n are printed
 *  in angle brackets and complained about; what is no conversion is printed as it stands; a conversion's field and
 *  precision are at most 4095 wide. */
Formatted format(const char* format, std::va_list values);

} // namespace board
