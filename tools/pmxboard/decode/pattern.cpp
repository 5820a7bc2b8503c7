#include "tools/pmxboard/decode/pattern.h"

#include <algorithm>

namespace pmxboard::decode
{
namespace
{

constexpr std::string_view null_name = "(null)";

// More than the layer ever prints, so that rubbish cannot keep a match busy.
constexpr std::size_t most_digits = 20;
constexpr std::size_t most_blanks = 8;
constexpr std::size_t longest_name = 40;

constexpr std::size_t weak_literal = 30;
constexpr std::size_t short_expression = 20;

bool is_digit(char c)
{
    return c >= '0' && c <= '9';
}

bool is_hex(char c)
{
    return is_digit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

Pattern compile(const Text& text)
{
    Pattern pattern{ &text, {}, false };
    const std::string_view format = visible(text.format);
    std::size_t literal = 0;
    std::size_t begin = 0;
    for (std::size_t i = 0; i < format.size(); ++i)
    {
        if (format[i] != '%' || text.role == Role::Assertion)
            continue;
        if (i > begin)
            pattern.pieces.push_back({ Piece::Kind::Literal, format.substr(begin, i - begin) });
        literal += i - begin;
        i = format.find_first_of("dxs", i);
        const char letter = format[i];
        pattern.pieces.push_back({ letter == 's'   ? Piece::Kind::Name
                                   : letter == 'x' ? Piece::Kind::Hex
                                                   : Piece::Kind::Decimal,
                                   {} });
        begin = i + 1;
    }
    if (begin < format.size())
        pattern.pieces.push_back({ Piece::Kind::Literal, format.substr(begin) });
    literal += format.size() - begin;
    pattern.weak = text.role != Role::Assertion && literal < weak_literal && is_word(format.front());
    return pattern;
}

std::vector<Pattern> compile_all()
{
    std::vector<Pattern> all;
    for (const Text& text : texts())
    {
        const bool told_by_its_file = text.role == Role::Assertion && text.format.size() < short_expression;
        const bool twin = !all.empty() && visible(all.back().text->format) == visible(text.format);
        if (!told_by_its_file && !twin)
            all.push_back(compile(text));
    }
    return all;
}

/** The length of a value at the beginning of `line`; 0 for none. */
std::size_t value_length(Piece::Kind kind, std::string_view line)
{
    std::size_t at = 0;
    if (kind == Piece::Kind::Name)
    {
        if (line.starts_with(null_name))
            return null_name.size();
        while (at < line.size() && at < longest_name && is_word(line[at]))
            ++at;
        return at;
    }
    if (kind == Piece::Kind::Hex)
    {
        while (at < line.size() && at < most_blanks && line[at] == ' ')
            ++at;
    }
    else if (line.starts_with('-'))
    {
        at = 1;
    }
    const std::size_t begin = at;
    while (at < line.size() && at - begin < most_digits && (kind == Piece::Kind::Hex ? is_hex : is_digit)(line[at]))
        ++at;
    return at == begin ? 0 : at;
}

} // namespace

bool is_word(char c)
{
    return is_digit(c) || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
}

const std::vector<Pattern>& patterns()
{
    static const std::vector<Pattern> all = compile_all();
    return all;
}

std::span<const Pattern* const> patterns_of(char first)
{
    static const auto by_first = [] {
        std::array<std::vector<const Pattern*>, 256> lists;
        for (const Pattern& pattern : patterns())
            lists[static_cast<unsigned char>(pattern.pieces.front().literal.front())].push_back(&pattern);
        return lists;
    }();
    return by_first[static_cast<unsigned char>(first)];
}

Match match(const Pattern& pattern, std::string_view line)
{
    return match_rest(pattern, 0, 0, line);
}

Match match_rest(const Pattern& pattern, std::size_t piece, std::size_t skip, std::string_view line)
{
    Match found;
    for (; piece < pattern.pieces.size(); ++piece, skip = 0)
    {
        const std::string_view rest = line.substr(found.end);
        if (pattern.pieces[piece].kind == Piece::Kind::Literal)
        {
            const std::string_view literal = pattern.pieces[piece].literal.substr(skip);
            const std::size_t most = std::min(literal.size(), rest.size());
            std::size_t same = 0;
            while (same < most && literal[same] == rest[same])
                ++same;
            found.end += same;
            found.literal += same;
            if (same == literal.size())
                continue;
            found.state = same == rest.size() ? Match::State::RanOut : Match::State::No;
            return found;
        }
        const std::size_t length = value_length(pattern.pieces[piece].kind, rest);
        if (length == 0)
        {
            const bool ended = rest.find_first_not_of(" -") == rest.npos || null_name.starts_with(rest);
            found.state = ended && rest.size() <= most_blanks ? Match::State::RanOut : Match::State::No;
            return found;
        }
        if (found.count < found.values.size())
            found.values[found.count++] =
                rest.substr(rest.find_first_not_of(' '), length - rest.find_first_not_of(' '));
        found.end += length;
    }
    found.state = Match::State::Whole;
    return found;
}

} // namespace pmxboard::decode
