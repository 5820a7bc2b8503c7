#include "tools/pmxboard/verb_usage.h"

#include <algorithm>
#include <cctype>

namespace pmxboard
{
namespace
{

constexpr std::string_view ellipsis = "…";

/** A place in a form: what may stand there, and the optional group that it is in. */
struct Place
{
    std::vector<UsageWord> choices;
    unsigned group = 0; ///< 0: in none
    bool repeats = false;
};

struct Form
{
    std::vector<Place> places;
    bool goes_on = false; ///< with prose
};

bool is_upper(char c)
{
    return std::isupper(static_cast<unsigned char>(c)) != 0;
}

bool is_placeholder(std::string_view word)
{
    return word.size() == 1 ? is_upper(word[0])
                            : is_upper(word[0]) && (is_upper(word[1]) || word[1] == 'x' || word[1] == '_');
}

/** `vdp0…vdp3`: the words of a range; any other word as it is. */
std::vector<UsageWord> expanded(std::string_view word)
{
    const std::size_t dots = word.find(ellipsis);
    const std::string_view first = word.substr(0, dots);
    const std::string_view last = dots == word.npos ? std::string_view() : word.substr(dots + ellipsis.size());
    if (last.empty())
        return { { std::string(first), !first.empty() && is_placeholder(first) } };
    std::vector<UsageWord> words;
    for (char digit = first.back(); digit <= last.back(); ++digit)
        words.push_back({ std::string(first.substr(0, first.size() - 1)) + digit, false });
    return words;
}

std::vector<std::string_view> split(std::string_view text, std::string_view separators)
{
    std::vector<std::string_view> parts;
    for (std::size_t at = 0; (at = text.find_first_not_of(separators, at)) != text.npos;)
    {
        const std::size_t end = std::min(text.find_first_of(separators, at), text.size());
        parts.push_back(text.substr(at, end - at));
        at = end;
    }
    return parts;
}

/** A form from its words, the verb among them. */
Form form_of(std::string_view text)
{
    Form form;
    unsigned group = 0;
    unsigned groups = 0;
    for (std::string_view word : split(text, " "))
    {
        if (word == "and" || word.starts_with('"'))
        {
            form.goes_on = true;
            break;
        }
        if (word.starts_with('['))
        {
            group = ++groups;
            word.remove_prefix(1);
        }
        const bool closes = word.ends_with(']');
        if (closes)
            word.remove_suffix(1);
        if (word == ellipsis && !form.places.empty())
            form.places.back().repeats = true;
        else
        {
            Place place{ {}, group, word.ends_with(ellipsis) };
            for (const std::string_view choice : split(word, "|"))
            {
                const auto words = expanded(choice);
                place.choices.insert(place.choices.end(), words.begin(), words.end());
            }
            form.places.push_back(std::move(place));
        }
        if (closes)
            group = 0;
    }
    return form;
}

/** `fault F A [on N|from N|always]`: a form for each choice of the group, when one of them has several words. */
void add_forms(std::string_view text, std::vector<Form>& forms)
{
    const std::size_t open = text.find('[');
    const std::size_t close = text.find(']');
    const std::string_view group =
        open < close && close != text.npos ? text.substr(open + 1, close - open - 1) : std::string_view();
    if (group.find(' ') == group.npos || group.find('|') == group.npos)
    {
        forms.push_back(form_of(text));
        return;
    }
    for (const std::string_view choice : split(group, "|"))
        forms.push_back(form_of(std::string(text.substr(0, open + 1)).append(choice).append(text.substr(close))));
}

/** The forms of a usage: what stands between commas and begins with the verb. */
std::vector<Form> forms_of(std::string_view usage)
{
    const std::string_view verb = usage.substr(0, usage.find_first_of(" ,"));
    std::vector<Form> forms;
    for (std::size_t at = 0; at < usage.size();)
    {
        const std::size_t end = std::min(usage.find(", ", at), usage.size());
        std::string_view text = usage.substr(at, end - at);
        if (text.starts_with("or "))
            text.remove_prefix(3);
        if (text == verb || (text.starts_with(verb) && text[verb.size()] == ' '))
            add_forms(text, forms);
        at = end == usage.size() ? end : end + 2;
    }
    return forms;
}

bool accepts(const Place& place, std::string_view word)
{
    return std::any_of(place.choices.begin(), place.choices.end(), [word](const UsageWord& choice) {
        if (!choice.is_placeholder) // a number is an example of one
            return choice.text == word || std::isdigit(static_cast<unsigned char>(choice.text.front())) != 0;
        return (choice.text != "VDP" || word.starts_with("vdp")) && (choice.text != "OSD" || word.starts_with("osd"));
    });
}

/** Collect what may stand behind `before`, from a place of the form on; true when nothing needs to. */
bool follow(const Form& form, std::size_t place, std::span<const std::string> before, std::vector<UsageWord>& into)
{
    const std::vector<Place>& places = form.places;
    if (place >= places.size())
        return before.empty() || form.goes_on;
    bool may_end = false;
    if (before.empty())
        into.insert(into.end(), places[place].choices.begin(), places[place].choices.end());
    else if (accepts(places[place], before.front()))
    {
        may_end = follow(form, place + 1, before.subspan(1), into);
        if (places[place].repeats)
            may_end = follow(form, place, before.subspan(1), into) || may_end;
    }
    // The whole optional group may be left out, where it begins.
    const unsigned group = places[place].group;
    if (group != 0 && places[place - 1].group != group)
    {
        std::size_t behind = place;
        while (behind < places.size() && places[behind].group == group)
            ++behind;
        may_end = follow(form, behind, before, into) || may_end;
    }
    return may_end;
}

} // namespace

std::vector<UsageWord> next_words(std::string_view usage, std::span<const std::string> before)
{
    std::vector<UsageWord> found;
    for (const Form& form : forms_of(usage))
        follow(form, 0, before, found);
    std::vector<UsageWord> once;
    for (const UsageWord& word : found)
    {
        const auto same = [&](const UsageWord& other) { return other.text == word.text; };
        if (!word.text.empty() && std::none_of(once.begin(), once.end(), same))
            once.push_back(word);
    }
    return once;
}

bool fits(std::string_view usage, std::span<const std::string> words)
{
    std::vector<UsageWord> more;
    for (const Form& form : forms_of(usage))
    {
        if (follow(form, 0, words, more))
            return true;
    }
    return false;
}

} // namespace pmxboard
