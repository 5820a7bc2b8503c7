// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Values as JSON. Only those include it who build JSON of their own, for the library compiles slowly; for the rest
 *  there are Value::to_json() and TraceEntry::to_json(). */
#pragma once

#include <string>

#include <nlohmann/json.hpp>

#include "board/value.h"

namespace board
{

using Json = nlohmann::ordered_json;

/** A number with a name is {"value": 12, "name": "RES_1080P60HZ"}, one that people read in hexadecimal has "hex" as
 *  well, an object that is known by name {"symbol": …}. */
Json json_of(const Value& value);

/** indent < 0: on one line. Bytes that are no UTF-8, which a console text may hold, become replacement characters. */
std::string written(const Json& json, int indent = -1);

} // namespace board
