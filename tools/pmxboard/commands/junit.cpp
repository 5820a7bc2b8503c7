// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/junit.h"

#include <algorithm>

#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

/** Fit for an attribute and for what stands between two tags. What XML does not know as a character is written out. */
std::string escaped(const std::string& text)
{
    std::string xml;
    for (const char c : printable(text))
        xml += c == '&' ? "&amp;" : c == '<' ? "&lt;" : c == '>' ? "&gt;" : c == '"' ? "&quot;" : std::string(1, c);
    return xml;
}

std::string to_xml(const Verdict& verdict)
{
    const std::string lead = "    <testcase classname=\"pmxboard\" name=\"" + escaped(verdict.scenario) + "\"";
    if (verdict.failures.empty())
        return lead + "/>\n";
    std::string text = lead + ">\n      <failure message=\"" + escaped(verdict.failures.front()) + "\">";
    for (const std::string& failure : verdict.failures)
        text += escaped(failure) + "\n";
    return text + "</failure>\n    </testcase>\n";
}

} // namespace

std::string to_junit(const std::vector<Verdict>& verdicts)
{
    const auto failed = std::count_if(verdicts.begin(), verdicts.end(),
                                      [](const Verdict& verdict) { return !verdict.failures.empty(); });
    const std::string counts =
        " tests=\"" + std::to_string(verdicts.size()) + "\" failures=\"" + std::to_string(failed) + "\"";
    std::string text = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<testsuites" + counts +
                       ">\n  <testsuite name=\"scenarios\"" + counts + ">\n";
    for (const Verdict& verdict : verdicts)
        text += to_xml(verdict);
    return text + "  </testsuite>\n</testsuites>\n";
}

} // namespace pmxboard
