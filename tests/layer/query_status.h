// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The status report as its tests look at it: the texts of its lines. */
#pragma once

#include <algorithm>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include <gtest/gtest.h>

#include "tests/support/layer_fixture.h"

/** A started layer with the default record, in RES_1080P60HZ. */
class QueryStatus : public LayerTest
{
protected:
    using Lines = std::vector<std::string>;

    void SetUp() override
    {
        LayerTest::SetUp();
        started();
        defaultReport = report();
    }

    /** The report on the default record. */
    Lines defaultReport;

    /** The texts of a report's lines. Whatever it does besides printing lines at level 0 is a failure. */
    static Lines report()
    {
        board::trace::clear();
        PMX_QueryStatus();
        Lines lines;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            EXPECT_TRUE(entry.kind == board::TraceEntry::Kind::Log && entry.function == "PMX_IsLog" && entry.level == 0)
                << entry.brief();
            lines.push_back(entry.text);
        }
        board::trace::clear();
        return lines;
    }

    /** A report with one line replaced by others, or left out. */
    static Lines with(Lines lines, std::string_view line, const Lines& replacement)
    {
        EXPECT_EQ(1, std::count(lines.begin(), lines.end(), line)) << line;
        const auto place = std::find(lines.begin(), lines.end(), line);
        if (place != lines.end())
            lines.insert(lines.erase(place), replacement.begin(), replacement.end());
        return lines;
    }

    /** Where the value of one field of the record shows: in one line of the report, or in none. */
    struct Place
    {
        std::string field;       ///< of the record
        std::string defaultLine; ///< what the report on the default record says there
    };

    /** With this number in the field of the default record the report has this line in its place and is the same in all
     *  others; no line: it is left out. */
    void expect_line(const Place& place, std::int64_t number, const Lines& line) const
    {
        SCOPED_TRACE(testing::Message() << place.field << " = " << number);
        const std::int64_t before = record(place.field);
        set_record(place.field, number);
        EXPECT_EQ(with(defaultReport, place.defaultLine, line), report());
        set_record(place.field, before);
    }
};
