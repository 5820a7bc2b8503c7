#include "tools/pmxboard/verb_words.h"

#include <algorithm>
#include <stdexcept>
#include <string_view>
#include <vector>

#include "board/duration.h"
#include "board/trace.h"
#include "tools/pmxboard/kind.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/step_error.h"

namespace pmxboard
{

void wrong_usage(const Line& line)
{
    for (const Verb& verb : verbs())
    {
        if (verb.name == line.word(0))
            throw LineError("write: " + std::string(verb.usage));
    }
    throw std::logic_error("a verb without a row");
}

void need_words(const Line& line, std::size_t least, std::size_t most)
{
    if (line.size() < least || line.size() > most)
        wrong_usage(line);
}

void need_platform_function(const std::string& name)
{
    std::vector<std::string_view> names;
    for (const auto& function : board::platform_functions())
        names.push_back(function.name);
    if (std::find(names.begin(), names.end(), name) == names.end())
        throw LineError("the platform has no function " + name + did_you_mean(name, names));
}

std::int64_t number_in(const std::string& word, const std::string& what, std::int64_t lowest, std::int64_t highest)
{
    const std::int64_t number = read_number(board::names::Family::None, word, what);
    if (number < lowest || number > highest)
        throw LineError(what + " is " + std::to_string(lowest) + " to " + std::to_string(highest) + ", not " + word);
    return number;
}

bool read_switch(const Line& line, const std::string& word)
{
    if (word != "on" && word != "off")
        wrong_usage(line);
    return word == "on";
}

std::string read_text(const Line& line, const std::string& word)
{
    if (!word.starts_with('"'))
        wrong_usage(line);
    return read_value({ .form = Kind::Form::Text, .names = {}, .members = {} }, word, "the text").string();
}

std::chrono::microseconds read_time(const Line& line, const std::string& word)
{
    try
    {
        if (const auto time = board::read_duration(word))
            return *time;
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
    wrong_usage(line);
}

} // namespace pmxboard
