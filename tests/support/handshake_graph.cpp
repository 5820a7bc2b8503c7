// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/support/handshake_graph.h"

#include <algorithm>
#include <set>
#include <sstream>
#include <stdexcept>
#include <utility>

namespace handshake
{
namespace
{

/** What a node leaves open: T and whether the video plane driver waits. */
using Open = std::pair<bool, bool>;
using Opens = std::set<Open>;

struct Node
{
    State state; ///< T and waiting mean nothing
    Opens opens;
};

struct Drawing
{
    std::vector<std::string> names; ///< of the nodes, nearest to Ready first
    std::map<std::string, Node> nodes;
    std::map<std::string, std::map<Event, std::map<std::string, Opens>>> ways; ///< from, event, to: when
};

Open open_of(const State& state)
{
    return { state.timer_set, state.waiting };
}

Drawing drawing_of(const Graph& graph)
{
    Drawing drawing;
    for (const State& state : graph.states)
    {
        const auto [node, is_new] = drawing.nodes.try_emplace(name(state), Node{ state, {} });
        if (is_new)
            drawing.names.push_back(name(state));
        node->second.opens.insert(open_of(state));
    }
    for (const Transition& transition : graph.transitions)
        drawing.ways[name(transition.from)][transition.event][name(transition.to)].insert(open_of(transition.from));
    return drawing;
}

std::set<bool> timers_of(const Opens& opens)
{
    std::set<bool> values;
    for (const auto& [timer, waiting] : opens)
        values.insert(timer);
    return values;
}

std::set<bool> waits_of(const Opens& opens)
{
    std::set<bool> values;
    for (const auto& [timer, waiting] : opens)
        values.insert(waiting);
    return values;
}

/** An event on an edge, and when it goes there. */
struct Way
{
    std::string wait;  ///< whether the video plane driver must wait; "" when it does not matter
    std::string event; ///< "flag lowered", "mode: HDMI unchanged, if T"
};

/** How an event takes this way, among all the occasions on which it can happen. */
Way way_of(Event event, const Opens& way, const Opens& all)
{
    const std::set<bool> timers = timers_of(way);
    const std::set<bool> waits = waits_of(way);
    if (timers.size() * waits.size() != way.size())
        throw std::logic_error("an edge's condition is more than one of T and one of waiting");
    Way result{ {}, name(event) };
    if (timers != timers_of(all))
        result.event += timers.contains(true) ? ", if T" : ", if not T";
    if (waits != waits_of(all))
        result.wait = waits.contains(true) ? "while the video plane waits:" : "unless the video plane waits:";
    return result;
}

/** A DOT text of several lines, each in a line of its own in the file, too. */
std::string quoted(const std::vector<std::string>& lines)
{
    std::string text;
    for (const std::string& line : lines)
        text += (text.empty() ? "\"" : " +\n        \"") + line + "\"";
    return text;
}

std::string node_label(const std::string& node_name, const Node& node)
{
    const std::set<bool> timers = timers_of(node.opens);
    std::string timer = timers.contains(true) ? "1" : "0";
    if (timers.size() > 1)
        timer = "0 or 1";
    const std::string flag = node.state.flag ? "1" : "0";
    const std::string owed = node.state.owed ? "1" : "0";
    const std::string planes = node.state.mixed == osd_planes ? "mixed" : "out";
    return quoted(
        { node_name + "\\n", "F " + flag + "   E " + owed + "   T " + timer + "\\n", "OSD planes " + planes });
}

/** The edges of one node, to each other one with its events. */
std::map<std::string, std::vector<Way>> edges_of(const std::string& from, const Drawing& drawing)
{
    std::map<std::string, std::vector<Way>> edges;
    for (const auto& [event, ways] : drawing.ways.at(from))
    {
        Opens all;
        for (const auto& [to, way] : ways)
            all.insert(way.begin(), way.end());
        for (const auto& [to, way] : ways)
        {
            if (to != from)
                edges[to].push_back(way_of(event, way, all));
        }
    }
    return edges;
}

/** One line for each event, those with a condition on waiting under it. */
std::string edge_label(std::vector<Way> ways)
{
    std::stable_sort(ways.begin(), ways.end(), [](const Way& a, const Way& b) { return a.wait < b.wait; });
    std::vector<std::string> lines;
    std::string wait;
    for (const Way& way : ways)
    {
        if (way.wait != wait)
            lines.push_back(way.wait + "\\l");
        wait = way.wait;
        lines.push_back((wait.empty() ? "" : "  ") + way.event + "\\l");
    }
    return quoted(lines);
}

} // namespace

std::string dot(const Graph& graph)
{
    const Drawing drawing = drawing_of(graph);
    std::ostringstream text;
    text << "// Written by the target handshake_graph from what the layer does on the virtual board.\n"
            "digraph handshake {\n"
            "    graph [rankdir=TB, nodesep=0.5, ranksep=0.7, fontname=\"sans-serif\", fontsize=12, labelloc=b,\n"
            "        label=\"F format-change flag   E OSD-enable flag   T timer armed\\n\" +\n"
            "        \"the video plane waits: for its sync control\\n\" +\n"
            "        \"Events that leave a state as it is are not drawn.\"];\n"
            "    node [shape=box, style=\"rounded,filled\", fillcolor=white, fontname=\"sans-serif\", fontsize=12];\n"
            "    edge [fontname=\"sans-serif\", fontsize=10];\n";
    for (const std::string& node_name : drawing.names)
    {
        const Node& node = drawing.nodes.at(node_name);
        text << "    \"" << node_name << "\" [label=" << node_label(node_name, node)
             << (node.state.mixed == osd_planes ? "" : ", fillcolor=lightgrey") << "];\n";
    }
    for (const std::string& from : drawing.names)
    {
        for (const auto& [to, ways] : edges_of(from, drawing))
            text << "    \"" << from << "\" -> \"" << to << "\" [label=" << edge_label(ways) << "];\n";
    }
    text << "}\n";
    return text.str();
}

} // namespace handshake
