// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Values as JSON. Only those include it who build JSON of their own, for the library compiles slowly; for the rest
 *  there are Value::to_json() and TraceEntry::to_json(). */
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

#include <nlohmann/json.hpp>

#include "board/value.h"

namespace board
{

using Json = nlohmann::ordered_json;

/** A number with a name is {"value": 12, "name": "RES_1080P60HZ"}, one that people read in hexadecimal has "hex" as
 *  well, an object that is known by name {"symbol": …}. */
Json json_of(const Value& value);

/** A text that is no JSON, or that is larger in some way than anything that this project writes; the message says what
 *  is wrong, and where. */
class JsonError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/** JSON that somebody else may have written. Throws JsonError. */
Json read_json(std::string_view text);

/** indent < 0: on one line. Bytes that are no UTF-8, which a console text may hold, become replacement characters;
 *  what a terminal would act on is escaped. */
std::string written(const Json& json, int indent = -1);

} // namespace board
