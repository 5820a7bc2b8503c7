// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Objects of the layer as they lie in memory, read by the table of their fields.
#include <bit>
#include <cstring>
#include <map>
#include <optional>
#include <stdexcept>
#include <unordered_map>

#include "board/executable_symbols.h"
#include "board/names.h"
#include "tools/record_view/record_layout.h"
#include "tools/record_view/record_view.h"

namespace record_view
{
namespace
{

using board::Value;

static_assert(std::endian::native == std::endian::little, "fields are read and written byte by byte, lowest first");

/** Words that are read bit by bit or digit by digit. */
bool reads_best_in_hex(std::string_view name)
{
    return name == "u4BgColor" || name == "u4Capability" || name == "u4PlaneOrder" || name == "PMX_debug_level";
}

/** What is known of a node before it is read. */
struct Known
{
    board::names::Family family = board::names::Family::None; ///< whose names its number has
    std::optional<Value::Names> names;                        ///< of a record: its children's
};

Known looked_up(const Node& node)
{
    Known known;
    if (is_single(node))
        known.family = board::names::family_of(node.owner, node.name);
    if (node.form == Node::Form::Record)
    {
        std::vector<std::string> names;
        for (const Node& child : node.children)
            names.push_back(child.name);
        known.names = Value::Names(std::move(names));
    }
    return known;
}

/** Looked up once: whole states are read at every command. All nodes are those of objects(), which stay. */
const Known& known_of(const Node& node)
{
    static std::unordered_map<const Node*, Known> all;
    const auto found = all.find(&node);
    return found != all.end() ? found->second : all.emplace(&node, looked_up(node)).first->second;
}

Value number_at(const Node& node, const unsigned char* at)
{
    const std::int64_t number = plain_number_at(node, at);
    if (node.form == Node::Form::Pointer)
        return number == 0 ? Value::null() : Value::number(number, {}, Value::Base::Hex);
    return Value::number(number, board::names::name_of(known_of(node).family, number),
                         reads_best_in_hex(node.name) ? Value::Base::Hex : Value::Base::Decimal);
}

std::map<const Object*, unsigned char*>& known_addresses()
{
    static std::map<const Object*, unsigned char*> known;
    return known;
}

} // namespace

void look_again()
{
    known_addresses().clear();
}

unsigned char* address_of(const Object& object)
{
    unsigned char*& address = known_addresses()[&object];
    if (address != nullptr)
        return address;

    const auto symbol = board::executable_symbols::find(object.symbol);
    if (!symbol)
        throw std::runtime_error("the layer's object " + object.symbol + " is not in this executable");
    // A checked build pads its objects.
    if (symbol->size < object.node.size)
        throw std::runtime_error("the layer's object " + object.symbol + " has " + std::to_string(symbol->size) +
                                 " bytes, not " + std::to_string(object.node.size));
    address = static_cast<unsigned char*>(symbol->address);
    return address;
}

std::int64_t plain_number_at(const Node& node, const unsigned char* at)
{
    std::uint64_t bits = 0;
    std::memcpy(&bits, at, node.size);
    if (node.is_signed && node.size == sizeof(std::int32_t))
        return static_cast<std::int32_t>(bits);
    return static_cast<std::int64_t>(bits);
}

Value value_at(const Node& node, const unsigned char* at)
{
    if (is_single(node))
        return number_at(node, at);
    std::vector<Value> items;
    items.reserve(node.children.size());
    for (const Node& child : node.children)
        items.push_back(value_at(child, at + child.offset));
    return node.form == Node::Form::List ? Value::list(std::move(items))
                                         : Value::record(known_of(node).names.value(), std::move(items));
}

} // namespace record_view
