// SPDX-License-Identifier: MIT OR GPL-2.0-only
// A fuzz target without a fuzzer: it runs the inputs that are there.
#include <algorithm>
#include <cstdint>
#include <exception>
#include <filesystem>
#include <iostream>
#include <string>
#include <vector>

#include "board/files.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace
{

/** The files of each directory, in order. A directory that is not there holds none. */
std::vector<std::filesystem::path> inputs_in(const std::vector<std::string>& directories)
{
    std::vector<std::filesystem::path> inputs;
    for (const std::string& directory : directories)
    {
        if (!std::filesystem::exists(directory))
            continue;
        for (const auto& entry : std::filesystem::directory_iterator(directory))
            inputs.push_back(entry.path());
    }
    std::sort(inputs.begin(), inputs.end());
    return inputs;
}

int replay(const std::vector<std::string>& directories)
{
    const auto inputs = inputs_in(directories);
    for (const std::filesystem::path& input : inputs)
    {
        std::cout << input.filename().string() << std::endl; // before it runs: it may be the last
        const std::string bytes = board::files::read(input);
        LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size());
    }
    std::cout << inputs.size() << " inputs\n";
    return inputs.empty() ? 1 : 0;
}

} // namespace

int main(int count, char** arguments)
try
{
    return replay({ arguments + 1, arguments + count });
}
catch (const std::exception& error)
{
    std::cerr << error.what() << '\n';
    return 1;
}
