// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where the layer's private objects keep their fields: one table, made from the layer's own types; and how they are
 *  read there. */
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "board/value.h"

namespace record_view
{

/** A field, or the fields below it. */
struct Node
{
    enum class Form
    {
        Number,
        Pointer,
        List,
        Record
    };

    std::string name; ///< without an index; empty for a whole record
    Form form = Form::Record;
    std::size_t offset = 0; ///< from the start of the enclosing node
    std::size_t size = 0;
    bool is_signed = false;
    std::string owner; ///< the record that holds it: "PMX_CONF_T"; empty for an object of its own
    std::vector<Node> children;
};

/** An object of the module. */
struct Object
{
    std::string symbol;
    std::string group; ///< the key under which it is shown: "record", "status", or "module" for single variables
    Node node;
};

/** Whether it is a field, with nothing below it. */
bool is_single(const Node& node);

/** How the path to a child is written: "name", "path.name", or "path[index]" in an array. */
std::string path_of_child(const Node& node, std::size_t index, const std::string& path);

const std::vector<Object>& objects();

/** Where an object lies in this executable. Throws std::runtime_error. */
unsigned char* address_of(const Object& object);

/** What stands at the place of a node of objects(), also in a copy of the object; numbers carry their names. */
board::Value value_at(const Node& node, const unsigned char* at);
/** The number alone, or a pointer's, of a single field. */
std::int64_t plain_number_at(const Node& node, const unsigned char* at);

} // namespace record_view
