/** @file
 *  Where the layer's private objects keep their fields: one table, made from the layer's own types. */
#pragma once

#include <cstddef>
#include <string>
#include <vector>

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

    std::string name; ///< without an index; empty for the items of an array of records
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

const std::vector<Object>& objects();

} // namespace record_view
