// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The layer's record and the module's other objects, seen from outside: the one place that looks in there. It finds
 *  the objects through the executable's symbol table, as a debugger does, so that it works on the object that ships,
 *  too.
 *
 *  A field is named as in C: "ucMode", "arPortInfo[3].eSrcColorSpace", "arOutputConf[PMX_OUTPUT_HDMI].eResMode",
 *  "_arPmxDispPartStatus.hPMXTimer", "MutexPMX". The keys of state() may lead the name: "record.ucMode",
 *  "status.hPMXTimer", "module.MutexPMX". */
#pragma once

#include <cstddef>
#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "board/value.h"

namespace record_view
{

struct Node;
struct Object;

/** A field that does not exist, or a number that does not fit into it; the message says which and names the nearest
 *  fields. */
class FieldError : public std::invalid_argument
{
public:
    using std::invalid_argument::invalid_argument;
};

/** Forget where the objects are: they are looked up anew. For whoever puts another layer in the place of the first. */
void look_again();

/** Everything, by name: {record={…}, status={…}, module={…}}. A null pointer is null; numbers carry their names. */
board::Value state();

/** A field, or a record or array of fields. Throws FieldError. */
board::Value get(std::string_view path);

/** A single field that is read often: what its name leads to is looked up once. */
class Field
{
public:
    /** Throws FieldError. */
    explicit Field(std::string_view path);

    std::int64_t number() const;

private:
    const Object* m_object;
    const Node* m_node;
    std::size_t m_offset;
};

/** Whether path names something that get() can read. */
bool has(std::string_view path);

/** Change one field; the number must fit its width. Throws FieldError, and then nothing has changed. */
void set(std::string_view path, std::int64_t number);

struct Range
{
    std::int64_t lowest = 0;
    std::int64_t highest = 0;
};

/** What a single field is, for reading a value that a person wrote. Throws FieldError for anything else. */
struct FieldType
{
    std::string path; ///< its name in fields()
    std::string
        record; ///< the record that holds it: "PMX_CONF_T", "PMX_PORT_INFO_T", …; empty for an object of its own
    std::string member; ///< its name there, without an index
    unsigned bits = 0;
    bool is_signed = false;

    Range range() const;
};
FieldType type_of(std::string_view path);

/** Every single field, arrays and nested records written out, in the order of the record. */
std::vector<std::string> fields();

} // namespace record_view
