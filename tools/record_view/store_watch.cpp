// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/record_view/store_watch.h"

#include <cstring>
#include <utility>
#include <vector>

#include "board/trace.h"
#include "tools/record_view/record_layout.h"
#include "tools/record_view/record_view.h"

namespace record_view
{
namespace
{

struct Watched
{
    const Object* object;
    const unsigned char* now;
    std::vector<unsigned char> before;
};

/** How the trace begins the names below an object: the record's stand alone. */
std::string prefix_of(const Object& object)
{
    return object.group == "record" ? "" : object.group == "module" ? object.symbol : object.group;
}

/** Tell the fields below a node whose bytes differ. */
void tell(const Node& node, const std::string& path, const unsigned char* before, const unsigned char* now)
{
    if (std::memcmp(before, now, node.size) == 0)
        return;
    if (is_single(node))
        board::trace::store(path, value_at(node, before), value_at(node, now));
    for (std::size_t i = 0; i < node.children.size(); ++i)
    {
        const Node& child = node.children[i];
        tell(child, path_of_child(node, i, path), before + child.offset, now + child.offset);
    }
}

std::vector<Watched>& watched()
{
    static std::vector<Watched> all;
    return all;
}

void look()
{
    for (Watched& one : watched())
    {
        if (std::memcmp(one.before.data(), one.now, one.before.size()) == 0)
            continue;
        // Kept before it is told: who listens may look again.
        const std::vector<unsigned char> now(one.now, one.now + one.before.size());
        const std::vector<unsigned char> before = std::exchange(one.before, now);
        tell(one.object->node, prefix_of(*one.object), before.data(), now.data());
    }
}

void begin_anew()
{
    for (Watched& one : watched())
        one.before.assign(one.now, one.now + one.before.size());
}

} // namespace

void watch_stores(bool on)
{
    watched().clear();
    if (!on)
    {
        board::trace::set_store_watch({});
        return;
    }
    for (const Object& object : objects())
    {
        const unsigned char* const address = address_of(object);
        watched().push_back({ &object, address, { address, address + object.node.size } });
    }
    board::trace::set_store_watch({ look, begin_anew });
}

std::string traced_name(std::string_view path)
{
    const std::string name = type_of(path).path;
    for (const Object& object : objects())
    {
        if (object.group == "status" && name.starts_with(object.symbol + "."))
            return object.group + name.substr(object.symbol.size());
    }
    return name;
}

} // namespace record_view
