// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The drawing of the handshake in docs/ shows what the layer does. */
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <sstream>
#include <string>

#include "tests/support/handshake_graph.h"

namespace
{

std::string content(const std::string& file)
{
    std::ifstream stream(std::string(PMX_SOURCE_DIR) + "/" + file);
    std::ostringstream text;
    text << stream.rdbuf();
    return text.str();
}

std::size_t count(const std::string& text, const std::string& part)
{
    std::size_t number = 0;
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + part.size()))
        ++number;
    return number;
}

} // namespace

TEST(HandshakeGraph, CommittedDot_IsWhatTheExplorationYields)
{
    EXPECT_EQ(handshake::dot(handshake::explore(handshake::ordinary_events())), content("docs/handshake.dot"))
        << "cmake --build build/debug --target handshake_graph writes it anew";
}

TEST(HandshakeGraph, Edges_SayWhenTheyAreTaken)
{
    const std::string dot = handshake::dot(handshake::explore(handshake::ordinary_events()));
    for (const char* edge : { R"(
    "Ready" -> "Display part switching" [label="flag raised\l"];
)",
                              R"(
    "Display part switching" -> "Held back" [label="mode: HDMI changed\l" +
        "mode: HDMI unchanged, if T\l"];
)",
                              R"(
    "Held back" -> "Ready" [label="unless the video plane waits:\l" +
        "  flag lowered\l" +
        "  mode: no sink\l" +
        "  mode: answered within the call\l" +
        "  mode: refused\l" +
        "  timer runs out\l"];
)" })
        EXPECT_EQ(1u, count(dot, edge)) << edge;
    EXPECT_EQ(0u, count(dot, R"("Ready" -> "Ready")"));
}

TEST(HandshakeGraph, CommittedPicture_HasTheNodesAndEdgesOfTheDot)
{
    const std::string dot = content("docs/handshake.dot");
    const std::string picture = content("docs/handshake.svg");
    EXPECT_EQ(7u, count(picture, "class=\"node\""));
    EXPECT_EQ(count(dot, " -> "), count(picture, "class=\"edge\""));
    std::istringstream lines(dot);
    for (std::string line; std::getline(lines, line);)
    {
        const std::size_t label = line.find(" [label=");
        if (label == std::string::npos || !line.starts_with("    \""))
            continue;
        // A title is an edge's or a node's name, with "->" as XML has it.
        std::string title = line.substr(4, label - 4);
        std::erase(title, '"');
        if (const std::size_t arrow = title.find(" -> "); arrow != std::string::npos)
            title.replace(arrow, 4, "&#45;&gt;");
        EXPECT_EQ(1u, count(picture, "<title>" + title + "</title>")) << title;
    }
    // Three lines of text in each node, one for each line of an edge's label, three under the drawing.
    EXPECT_EQ(7 * 3 + count(dot, "\\l\"") + 3, count(picture, "<text "));
}
