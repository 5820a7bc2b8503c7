// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "fuzz/support/holds.h"

#include <algorithm>
#include <cstdlib>
#include <iostream>
#include <nlohmann/json.hpp>
#include <sstream>

#include "tools/pmxboard/text/printable.h"

namespace fuzz
{

void must(bool holds, std::string_view what)
{
    if (holds)
        return;
    std::cerr << "does not hold: " << what << std::endl;
    std::abort();
}

void must_be_fit(const std::string& text)
{
    const std::string fit = pmxboard::printable_lines(text);
    if (fit == text)
        return;
    const auto [unfit, ignored] = std::mismatch(text.begin(), text.end(), fit.begin(), fit.end());
    const auto at = static_cast<std::size_t>(unfit - text.begin());
    std::cerr << "..." << pmxboard::printable(text.substr(at < 60 ? 0 : at - 60, 120)) << '\n';
    must(false, "what is shown is fit for a terminal");
}

void must_be_json(const std::string& text)
{
    must(nlohmann::json::accept(text), "what programs read is JSON");
}

void must_be_json_lines(const std::string& text)
{
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);)
        must_be_json(line);
}

} // namespace fuzz
