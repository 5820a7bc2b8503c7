// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/support/assertion_places.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <fstream>

namespace
{

constexpr const char* layer = "src/driver/pmx";

/** The texts in quotes; what stands side by side is one. */
std::vector<std::string> texts_of(const std::string& statement)
{
    std::vector<std::string> texts;
    bool goes_on = false;
    for (std::size_t at = 0; at < statement.size(); ++at)
    {
        if (statement[at] != '"')
        {
            goes_on = goes_on && std::isspace(static_cast<unsigned char>(statement[at])) != 0;
            continue;
        }
        const std::size_t end = statement.find('"', at + 1);
        if (end == std::string::npos)
            break;
        const std::string text = statement.substr(at + 1, end - at - 1);
        if (goes_on)
            texts.back() += text;
        else
            texts.push_back(text);
        goes_on = true;
        at = end;
    }
    return texts;
}

void read_places(const std::filesystem::path& path, std::vector<AssertionPlace>& places)
{
    std::ifstream in(path);
    std::string statement;
    AssertionPlace place{ std::string(layer) + "/" + path.filename().string(), 0, {} };
    std::int64_t number = 0;
    for (std::string line; std::getline(in, line);)
    {
        ++number;
        if (statement.empty() && line.find("Assert(") == std::string::npos)
            continue;
        statement += line + "\n";
        if (line.find("__LINE__") != std::string::npos)
            place.line = number;
        if (!line.ends_with(';'))
            continue;
        place.texts = texts_of(statement);
        places.push_back(place);
        statement.clear();
        place.line = 0;
    }
}

} // namespace

bool AssertionPlace::may_report(const std::string& text) const
{
    return texts.empty() || std::find(texts.begin(), texts.end(), text) != texts.end();
}

std::vector<AssertionPlace> assertion_places()
{
    std::vector<std::filesystem::path> sources;
    for (const auto& entry : std::filesystem::directory_iterator(std::filesystem::path(PMX_SOURCE_DIR) / layer))
    {
        if (entry.path().extension() == ".cpp")
            sources.push_back(entry.path());
    }
    std::sort(sources.begin(), sources.end());
    std::vector<AssertionPlace> places;
    for (const std::filesystem::path& source : sources)
        read_places(source, places);
    return places;
}

std::vector<AssertionReport> assertion_reports()
{
    std::vector<AssertionReport> reports;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (entry.kind == board::TraceEntry::Kind::Assert)
            reports.push_back({ entry.arguments.at(0).value.string(), entry.arguments.at(1).value.string(),
                                entry.arguments.at(2).value.as_number() });
    }
    return reports;
}

const AssertionPlace* place_of(const AssertionReport& report, const std::vector<AssertionPlace>& places)
{
    for (const AssertionPlace& place : places)
    {
        if (place.file == report.file && place.line == report.line && place.may_report(report.text))
            return &place;
    }
    ADD_FAILURE() << "nothing that reports \"" << report.text << "\" stands at " << report.file << ":" << report.line;
    return nullptr;
}
