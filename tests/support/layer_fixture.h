// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The ground that tests of the layer stand on: a board that is powered on with a boot image of the test's choice, the
 *  trace compared with lines written out, the layer's record by field name. A test arranges the board, calls the layer,
 *  compares the trace, then the record:
 *
 *      using Lifecycle = LayerTest;
 *
 *      TEST_F(Lifecycle, Stop_StopsVsyncHandling)
 *      {
 *          started();
 *          const RecordSnapshot before;
 *          PMX_Stop();
 *          EXPECT_TRACE(R"(
 *              LOG1 "PMX_Stop\n"
 *              PMX_VsyncStop()
 *          )");
 *          EXPECT_RECORD_CHANGED(before, "_PmxInitiated");
 *      } */
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "board/board.h"
#include "drv_pmx.h"

/** The layer's objects at one moment: record, handshake and the module's others. */
class RecordSnapshot
{
public:
    /** Taken now. */
    RecordSnapshot();

    struct Change
    {
        std::string field; ///< "ucMode", "arPortInfo[3].eSrcColorSpace", "status.hPMXTimer", "MutexPMX"
        std::string before;
        std::string now;
    };
    /** What is different by now, in the order of the record. */
    std::vector<Change> changes() const;

private:
    board::Value m_state;
};

class LayerTest : public testing::Test
{
public:
    /** A number of the layer's record or its other objects: "ucMode", "arPortInfo[3].eSrcColorSpace",
     *  "status.hPMXTimer", "MutexPMX"; 0 for a null pointer. */
    static std::int64_t record(std::string_view field);
    static void set_record(std::string_view field, std::int64_t number);

    /** The board's own notices since the trace was last cleared, in the form of TraceEntry::brief(). EXPECT_TRACE
     *  passes over them. */
    static std::vector<std::string> notices();

protected:
    void SetUp() override;
    void TearDown() override;

    /** What power_on() gives the board: one flash partition, "fast_init_param", whose first word is 0x0000010C. */
    board::Description description;

    /** Make board and layer as good as new and clear the trace. Assertions and misuses until then are checked. */
    void power_on();
    /** PMX_Init, then clear the trace. */
    static void started();

    /** Contents of "fast_init_param", from now on: one little-endian word; any bytes; no such partition. */
    void boot_word(std::uint32_t word);
    void boot_image(const std::vector<std::uint8_t>& bytes);
    void no_boot_partition();

    /** So many failed assertions, or misuses of the platform, are right since power-on; unless told otherwise: none. */
    void expect_asserts(unsigned number) { m_asserts = number; }
    void expect_misuses(unsigned number) { m_misuses = number; }

    /** A platform function answers this, however often it is called. */
    static void fail(const char* function, std::int64_t answer);

    /** As IPMX takes it: a number carried in a pointer. */
    static void* tag(std::uintptr_t number) { return reinterpret_cast<void*>(number); }

    /** From now on the trace holds what is stored, so that EXPECT_TRACE shows it: `SET ucMode RES_480I → RES_480P`. */
    static void watch_stores();

    /** Run an action whenever this platform function is about to return, to look at the layer in the middle of an
     *  operation. A later one replaces it. */
    static void at_call(std::string function, std::function<void()> action);

private:
    void check_reports();
    std::filesystem::path write_image(const std::vector<std::uint8_t>& bytes) const;

    std::filesystem::path m_directory;
    unsigned m_asserts = 0;
    unsigned m_misuses = 0;
};

namespace layer_test
{

testing::AssertionResult trace_is(const char* expression, const std::string& lines);
testing::AssertionResult calls_are(const char* expression, const std::string& lines);
testing::AssertionResult changed_are(const char* snapshot_expression, const char* fields_expression,
                                     const RecordSnapshot& before, const std::vector<std::string>& fields);

} // namespace layer_test

/** The trace since it was last cleared is these lines and nothing else, each in the form of TraceEntry::brief();
 *  leading blanks and blank lines do not count. The trace is cleared. */
#define EXPECT_TRACE(lines) EXPECT_PRED_FORMAT1(::layer_test::trace_is, lines)
#define EXPECT_NO_TRACE() EXPECT_TRACE("")
/** The same without log lines and register reads: for tests that are about something else. */
#define EXPECT_CALLS(lines) EXPECT_PRED_FORMAT1(::layer_test::calls_are, lines)

/** These fields are different from the snapshot, and all others are not. */
#define EXPECT_RECORD_CHANGED(before, ...) \
    EXPECT_PRED_FORMAT2(::layer_test::changed_are, before, (std::vector<std::string>{ __VA_ARGS__ }))
#define EXPECT_RECORD_UNCHANGED(before) \
    EXPECT_PRED_FORMAT2(::layer_test::changed_are, before, (std::vector<std::string>{}))
