// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/text/layout.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>

namespace pmxboard
{

bool is_on_screen()
{
    return isatty(STDOUT_FILENO) == 1;
}

unsigned text_width()
{
    winsize window{};
    if (!is_on_screen() || ioctl(STDOUT_FILENO, TIOCGWINSZ, &window) != 0 || window.ws_col == 0)
        return usual_width;
    return std::clamp(static_cast<unsigned>(window.ws_col), 40u, 100u);
}

std::size_t columns_of(std::string_view text)
{
    return static_cast<std::size_t>(
        std::count_if(text.begin(), text.end(), [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; }));
}

std::string wrapped(std::string_view text, unsigned width, unsigned indent, unsigned hanging)
{
    std::string all;
    std::string line(indent, ' ');
    bool is_empty = true;
    for (std::size_t at = 0; at < text.size();)
    {
        const std::size_t word = std::min(text.find_first_not_of(' ', at), text.size());
        const std::size_t end = std::min(text.find(' ', word), text.size());
        const std::string_view next = text.substr(word, end - word);
        if (!is_empty && columns_of(line) + (word - at) + columns_of(next) > width)
        {
            all += line + "\n";
            line.assign(hanging, ' ').append(next);
        }
        else
            line.append(word - at, ' ').append(next);
        is_empty = false;
        at = end;
    }
    return is_empty ? all : all + line + "\n";
}

std::string in_columns(const std::vector<std::string>& words, unsigned width)
{
    std::size_t longest = 0;
    for (const std::string& word : words)
        longest = std::max(longest, columns_of(word));
    const std::size_t columns = std::max<std::size_t>(1, (width + 2) / (longest + 2));
    const std::size_t rows = (words.size() + columns - 1) / columns;
    std::string text;
    for (std::size_t row = 0; row < rows; ++row)
    {
        for (std::size_t i = row; i < words.size(); i += rows)
            text += words[i] + (i + rows < words.size() ? std::string(longest + 2 - columns_of(words[i]), ' ') : "\n");
    }
    return text;
}

std::string folded(const std::string& line, std::size_t indent, unsigned width)
{
    std::string lines;
    std::size_t begin = 0;
    std::size_t comma = 0; // behind the last one of this line
    bool quoted = false;
    for (std::size_t i = 0; i < line.size(); ++i)
    {
        if (line[i] == '"' && (i == 0 || line[i - 1] != '\\'))
            quoted = !quoted;
        const std::size_t column = i - begin + (begin == 0 ? 0 : indent);
        if (column >= width && comma > begin)
        {
            lines += line.substr(begin, comma - begin) + '\n' + std::string(indent, ' ');
            begin = comma + 1;
        }
        if (!quoted && line[i] == ',')
            comma = i + 1;
    }
    return lines + line.substr(begin);
}

} // namespace pmxboard
