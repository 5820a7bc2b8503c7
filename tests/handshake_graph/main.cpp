// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Writes the handshake with the display part to a file: the graph of its ordinary states, as DOT, or every transition
// of all of them, a line each.
#include <cstdio>
#include <exception>
#include <fstream>
#include <string_view>

#include "tests/support/handshake_graph.h"

int main(int argc, char** argv)
{
    const std::string_view form = argc == 3 ? argv[1] : "";
    if (form != "dot" && form != "transitions")
    {
        std::fputs("usage: handshake_graph_writer dot|transitions FILE\n", stderr);
        return 2;
    }
    try
    {
        const std::string text = form == "dot" ? handshake::dot(handshake::explore(handshake::ordinary_events()))
                                               : handshake::table(handshake::explore(handshake::all_events()));
        std::ofstream file(argv[2], std::ios::trunc);
        file << text;
        file.close();
        if (file)
            return 0;
        std::fprintf(stderr, "cannot write %s\n", argv[2]);
    }
    catch (const std::exception& error)
    {
        std::fprintf(stderr, "%s\n", error.what());
    }
    return 1;
}
