// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  `pmxboard record` and `pmxboard replay`: recordings of what goes in and out of the layer. */
#pragma once

#include <cstdint>
#include <string>

namespace pmxboard
{

struct RecordOptions
{
    static constexpr std::uint32_t least_size = 1 << 14;
    static constexpr std::uint32_t largest_size = 1 << 30;

    std::string file;
    std::string scenario;
    std::string board;
    std::uint32_t size = 1 << 20;
};

struct ReplayOptions
{
    std::string file;
    bool quiet = false;
    bool show = false;
    bool json = false;
    bool chrome = false;
    bool to_scenario = false;
};

/** The exit code. */
int record_scenario(const RecordOptions& options);
int replay_file(const ReplayOptions& options);

} // namespace pmxboard
