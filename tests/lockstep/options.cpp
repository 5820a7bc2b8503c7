// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/options.h"

#include <cstdlib>
#include <functional>
#include <iostream>
#include <map>

namespace lockstep
{
namespace
{

[[noreturn]] void refuse(const std::string& what, const char* usage)
{
    std::cerr << what << '\n' << usage;
    std::exit(2);
}

struct Option
{
    int values;
    std::function<void(char**)> take;
};

} // namespace

Options options_of(int count, char** words, const char* usage)
{
    Options options;
    const auto number = [&](const char* text) {
        char* end = nullptr;
        const unsigned long long value = std::strtoull(text, &end, 0);
        if (*text < '0' || *text > '9' || *end != '\0')
            refuse(std::string("not a number: ") + text, usage);
        return value;
    };
    const std::map<std::string, Option> known = {
        { "--count", { 1, [&](char** values) { options.count = number(values[0]); } } },
        { "--seed", { 1, [&](char** values) { options.seed = number(values[0]); } } },
        { "--operation",
          { 1, [&](char** values) { options.operation = operations[operation_number(values[0])].function.name; } } },
        { "--bases", { 1, [&](char** values) { options.bases = values[0]; } } },
        { "--part",
          { 2,
            [&](char** values) {
                options.part = number(values[0]);
                options.parts = number(values[1]);
                if (options.part >= options.parts)
                    refuse("there is no such part", usage);
            } } },
        { "--names",
          { 2,
            [&](char** values) {
                options.comparison.names[0] = values[0];
                options.comparison.names[1] = values[1];
            } } },
        { "--undisturbed", { 0, [&](char**) { options.disturbed = false; } } },
        { "--no-padding", { 0, [&](char**) { options.comparison.padding = false; } } },
        { "--no-files", { 0, [&](char**) { options.comparison.places_of_checks = false; } } },
        { "--all", { 0, [&](char**) { options.all = true; } } },
    };
    for (int i = 1; i < count; ++i)
    {
        const auto option = known.find(words[i]);
        if (option == known.end() || std::string(usage).find(option->first) == std::string::npos)
            refuse(std::string("no such option: ") + words[i], usage);
        if (i + option->second.values >= count)
            refuse(option->first + " takes more", usage);
        option->second.take(words + i + 1);
        i += option->second.values;
    }
    return options;
}

} // namespace lockstep
