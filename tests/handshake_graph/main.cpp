// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Writes the state graph of the handshake with the display part, as DOT, to a file.
#include <cstdio>
#include <exception>
#include <fstream>

#include "tests/support/handshake_graph.h"

int main(int argc, char** argv)
{
    if (argc != 2)
    {
        std::fputs("usage: handshake_graph_writer FILE\n", stderr);
        return 2;
    }
    try
    {
        const std::string text = handshake::dot(handshake::explore(handshake::ordinary_events()));
        std::ofstream file(argv[1], std::ios::trunc);
        file << text;
        file.close();
        if (file)
            return 0;
        std::fprintf(stderr, "cannot write %s\n", argv[1]);
    }
    catch (const std::exception& error)
    {
        std::fprintf(stderr, "%s\n", error.what());
    }
    return 1;
}
