// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Runs scenarios, and writes every call of an operation that they make, each once: operation, arguments, and the state
 * that it finds. */
#include <cstring>
#include <fstream>
#include <iostream>
#include <set>
#include <sstream>

#include "tests/lockstep/gathered.h"
#include "tests/lockstep/lockstep.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/record_view/record_layout.h"

namespace lockstep
{
namespace
{

std::set<std::string> lines;
std::ofstream output;

std::vector<unsigned char> image_now()
{
    std::vector<unsigned char> image(image_size(), 0xC3);
    std::size_t offset = 0;
    for (const record_view::Object& object : record_view::objects())
    {
        const std::size_t next = (offset + object.node.size + 7) / 8 * 8;
        std::memset(&image[offset], 0, next - offset);
        for (std::size_t i = 0; i < gathered_state_count; ++i)
        {
            if (object.symbol == gathered_state[i].name)
                std::memcpy(&image[offset], gathered_state[i].address, object.node.size);
        }
        offset = next;
    }
    return image;
}

} // namespace

void Gathered::array(const void* first, std::size_t size)
{
    place(first);
    const auto* const bytes = static_cast<const unsigned char*>(first);
    m_array.assign(bytes, bytes + size);
}

void Gathered::write() const
{
    constexpr char digits[] = "0123456789abcdef";
    std::vector<unsigned char> image = image_now();
    std::copy(m_array.begin(), m_array.end(), image.begin() + static_cast<std::ptrdiff_t>(caller_offset()));
    std::string line = m_line + " ";
    for (const unsigned char byte : image)
        line.append(1, digits[byte >> 4]).append(1, digits[byte & 0xF]);
    if (lines.insert(line).second)
        output << line << '\n';
}

} // namespace lockstep

int main(int count, char** words)
{
    if (count < 3)
    {
        std::cerr << "usage: gather OUTPUT SCENARIO...\n";
        return 2;
    }
    lockstep::output.open(words[1]);
    for (int i = 2; i < count; ++i)
    {
        std::ifstream scenario(words[i]);
        std::ostringstream shown;
        pmxboard::OutputOptions options;
        options.to = &shown;
        if (!pmxboard::run_scenario(scenario, { words[i], "default", "" }, options, std::cerr))
            return 1;
    }
    lockstep::output.close();
    std::cout << lockstep::lines.size() << " calls gathered from " << count - 2 << " scenarios\n";
    return lockstep::output && !lockstep::lines.empty() ? 0 : 1;
}
