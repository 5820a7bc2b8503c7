// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Where everything stands in an image: the state's objects in the order of the record's layout, the caller's memory
 * behind them. */
#include <cstring>
#include <stdexcept>
#include <string>

#include "tests/lockstep/lockstep.h"

#include "drv_if_pmx.h"
#include "tools/record_view/record_layout.h"

namespace lockstep
{
namespace
{

using record_view::Node;

void add_fields(const Node& node, const std::string& name, std::size_t offset, std::vector<Field>& fields)
{
    if (record_view::is_single(node))
    {
        fields.push_back({ name, offset, node.size, draw_for_field(name) });
        return;
    }
    for (std::size_t i = 0; i < node.children.size(); ++i)
    {
        const Node& child = node.children[i];
        add_fields(child, record_view::path_of_child(node, i, name), offset + child.offset, fields);
    }
}

struct Layout
{
    std::vector<Field> fields;
    std::size_t caller = 0;
};

const Layout& layout()
{
    static const Layout made = [] {
        Layout layout;
        for (const record_view::Object& object : record_view::objects())
        {
            const bool is_variable = object.group == "module";
            const std::string name = is_variable ? object.symbol : object.group == "record" ? "" : object.symbol;
            add_fields(object.node, name, layout.caller, layout.fields);
            layout.caller = (layout.caller + object.node.size + 7) / 8 * 8;
        }
        return layout;
    }();
    return made;
}

std::vector<Field> outputs_array()
{
    std::vector<Field> fields;
    for (const Node& child : record_view::objects().front().node.children)
    {
        if (child.name == "arOutputConf")
            add_fields(child, "prOutConf", caller_offset(), fields);
    }
    return fields;
}

std::vector<Field> words_array()
{
    std::vector<Field> fields;
    for (std::size_t i = 0; i < 8; ++i)
    {
        const std::string name = "pu4PlaneOrder[" + std::to_string(i) + "]";
        fields.push_back({ name, caller_offset() + 4 * i, 4, draw_for_field(name) });
    }
    return fields;
}

static_assert(PMX_OUTPUT_NUM * sizeof(PMX_RESOLUTION_T) <= array_size);

} // namespace

const std::vector<Field>& state_fields()
{
    return layout().fields;
}

const Field& state_field(const std::string& name)
{
    for (const Field& field : state_fields())
    {
        if (field.name == name)
            return field;
    }
    throw std::invalid_argument("the state has no field " + name);
}

std::size_t caller_offset()
{
    return layout().caller;
}

std::size_t image_size()
{
    return layout().caller + caller_size;
}

const std::vector<Field>& array_fields(const Operation& operation)
{
    static const std::vector<Field> none;
    static const std::vector<Field> outputs = outputs_array();
    static const std::vector<Field> words = words_array();
    for (unsigned i = 0; i < operation.function.count; ++i)
    {
        const Parameter& parameter = operation.function.parameters[i];
        if (parameter.kind == Kind::data)
            return std::strcmp(parameter.type, "PMX_RESOLUTION_T*") == 0 ? outputs : words;
    }
    return none;
}

std::string field_at(const Operation& operation, std::size_t offset)
{
    const std::string* before = nullptr;
    for (const std::vector<Field>* fields : { &state_fields(), &array_fields(operation) })
    {
        for (const Field& field : *fields)
        {
            if (offset >= field.offset && offset < field.offset + field.size)
                return field.name;
            if (field.offset <= offset)
                before = &field.name;
        }
    }
    if (offset >= caller_offset() + array_size)
        return offset < caller_offset() + array_size + place_size ? "the first result" : "the second result";
    return "padding behind " + (before == nullptr ? std::string("nothing") : *before);
}

std::uint64_t get(const unsigned char* image, const Field& field)
{
    std::uint64_t value = 0;
    std::memcpy(&value, image + field.offset, field.size);
    return value;
}

std::uint64_t get(const Image& image, const Field& field)
{
    return get(image.data(), field);
}

void set(Image& image, const Field& field, std::uint64_t value)
{
    std::memcpy(&image.at(field.offset), &value, field.size);
}

} // namespace lockstep
