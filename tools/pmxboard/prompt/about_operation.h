// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What there is to tell about a function of the layer or of the platform. */
#pragma once

#include <string>
#include <string_view>

#include "board/value.h"
#include "tools/pmxboard/functions/contracts.h"
#include "tools/pmxboard/functions/operation.h"
#include "tools/pmxboard/text/layout.h"

namespace pmxboard
{

/** How an operation is called, its contract and an example. */
std::string operation_text(const Operation& operation, const Look& look);
/** The contract of a function that the platform provides. */
std::string platform_text(std::string_view function, const Look& look);
/** What a contract says of itself; arguments as an operation of the tool has them, or, of the platform (null pointer),
 *  by name alone. */
board::Value json_of(const Contract& contract, const Operation* operation);

} // namespace pmxboard
