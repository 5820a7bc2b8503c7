// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What is stored into the layer's objects, told to the trace: record, handshake and the module's others are compared
 *  whenever those who may store take turns. Stores between two such moments are told in the order of the fields, for
 *  the order in which they were made cannot be seen; a field that has its old content again was not seen at all. */
#pragma once

#include <string>
#include <string_view>

namespace record_view
{

/** Watch stores from now on, or no more. */
void watch_stores(bool on);

/** A field's name in the trace: "ucMode", "arPortInfo[3].fgEnabled", "status.hPMXTimer", "MutexPMX"; from any name
 *  that record_view::get() takes. Throws FieldError when it is no single field. */
std::string traced_name(std::string_view path);

} // namespace record_view
