// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/bases.h"

#include <cstdlib>
#include <fstream>
#include <iostream>
#include <set>
#include <sstream>

#include "tests/lockstep/draw.h"

namespace lockstep
{
namespace
{

constexpr unsigned draws_for_each = 3000;
constexpr std::size_t calls_for_each = 250; // in all ways together: their number is what a trial costs
constexpr std::size_t fewest_for_each = 12; // with various arguments, even if there is one way only

/* A call by its function and, for a log line, its format. */
std::uint64_t site_of(const Trace& trace, const Call& call)
{
    std::uint64_t site = call.function;
    const Function& function = platform[call.function];
    for (unsigned i = 0; i < function.count; ++i)
    {
        if (function.parameters[i].kind != Kind::text)
            continue;
        const Given& given = trace.given[call.first + i];
        for (std::uint32_t k = 0; k < given.size; ++k)
            site = mixed(site * 31 + trace.bytes[given.at + k]);
    }
    return site;
}

/* Which bases of an operation are worth their trials. */
class Choice
{
public:
    bool takes(const Trace& trace)
    {
        std::uint64_t way = mixed(trace.result);
        bool is_new_site = false;
        for (const Call& call : trace.calls)
        {
            const std::uint64_t site = site_of(trace, call);
            way = mixed(way * 31 + site);
            is_new_site = m_sites.insert(site).second || is_new_site;
        }
        const bool is_new_way = m_calls < calls_for_each && m_ways.insert(way).second;
        const bool is_needed = m_taken < fewest_for_each && trace.calls.size() < calls_for_each / fewest_for_each;
        if (!is_new_site && !is_new_way && !is_needed)
            return false;
        m_calls += trace.calls.size() + 1;
        ++m_taken;
        return true;
    }

private:
    std::set<std::uint64_t> m_sites;
    std::set<std::uint64_t> m_ways;
    std::size_t m_calls = 0;
    std::size_t m_taken = 0;
};

[[noreturn]] void refuse(const std::string& path, const std::string& line)
{
    std::cerr << path << ": not a call that was gathered: " << line.substr(0, 80) << '\n';
    std::exit(2);
}

unsigned digit_of(char digit)
{
    return digit <= '9' ? static_cast<unsigned>(digit - '0') : static_cast<unsigned>(digit - 'a' + 10);
}

bool read_image(const std::string& hex, Image& image)
{
    if (hex.size() != 2 * image_size() || hex.find_first_not_of("0123456789abcdef") != std::string::npos)
        return false;
    image.resize(image_size());
    for (std::size_t i = 0; i < image.size(); ++i)
        image[i] = static_cast<unsigned char>(digit_of(hex[2 * i]) * 16 + digit_of(hex[2 * i + 1]));
    return true;
}

} // namespace

Trial drawn_trial(const Operation& operation, Random& random)
{
    Trial trial;
    trial.operation = &operation;
    trial.before = started_state();
    if (!random.once_in(16))
        draw_state(random, trial.before);
    trial.arguments = draw_arguments(random, operation, trial.before);
    trial.surroundings.seed = random.next();
    trial.surroundings.calm = random.once_in(2);
    return trial;
}

std::vector<Trial> drawn_bases(const Operation& operation)
{
    Random random(static_cast<std::uint64_t>(&operation - operations));
    std::vector<Trial> bases;
    Choice choice;
    Trace trace;
    for (unsigned i = 0; i < draws_for_each; ++i)
    {
        const Trial trial = drawn_trial(operation, random);
        run(operation, 1, trial.arguments, trial.before, trial.surroundings, trace);
        if (choice.takes(trace))
            bases.push_back(trial);
    }
    return bases;
}

/* A line is a call: the operation, its arguments, the image. A pointer is 0 or "p". */
std::vector<Trial> gathered_bases(const std::string& path)
{
    std::ifstream file(path);
    if (!file)
    {
        std::cerr << path << ": cannot be read\n";
        std::exit(2);
    }
    std::vector<Trial> bases;
    for (std::string line; std::getline(file, line);)
    {
        std::istringstream words(line);
        std::string word;
        words >> word;
        Trial trial;
        trial.operation = &operations[operation_number(word)];
        trial.arguments = caller_arguments(*trial.operation);
        for (unsigned i = 0; i < trial.operation->function.count && words >> word; ++i)
        {
            if (word != "p")
                trial.arguments[i] = std::strtoull(word.c_str(), nullptr, 0);
        }
        if (!(words >> word) || !read_image(word, trial.before) || words >> word)
            refuse(path, line);
        trial.surroundings.seed = bases.size();
        trial.surroundings.calm = bases.size() % 2 == 0;
        bases.push_back(trial);
    }
    return bases;
}

} // namespace lockstep
