// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include <array>
#include <filesystem>
#include <fstream>
#include <stdexcept>

#include "board/flash.h"
#include "u_os.h"

namespace
{

class Flash : public DeviceTest
{
protected:
    void SetUp() override
    {
        m_directory = std::filesystem::temp_directory_path() /
                      ("flash_test_" + std::to_string(::testing::UnitTest::GetInstance()->random_seed()) + "_" +
                       ::testing::UnitTest::GetInstance()->current_test_info()->name());
        std::filesystem::create_directories(m_directory);
        board::Description description;
        description.flash = { { "boot", image("boot.bin", "\x0C\x01\x02\x03\x04\x05") },
                              { "empty", image("e.bin", "") } };
        power_on(description);
    }

    void TearDown() override
    {
        std::filesystem::remove_all(m_directory);
        DeviceTest::TearDown();
    }

    std::filesystem::path image(const std::string& name, const std::string& content) const
    {
        std::ofstream(m_directory / name, std::ios::binary) << content;
        return m_directory / name;
    }

    static std::string now(std::string_view path) { return member(board::flash::state(), path); }

    std::filesystem::path m_directory;
    std::array<UINT8, 4> m_bytes{ 0xAA, 0xAA, 0xAA, 0xAA };
};

TEST_F(Flash, PartId_IsTheIndexInNameOrder_NegativeWhenMissing)
{
    EXPECT_EQ(0, get_part_id_by_name("boot"));
    EXPECT_EQ("get_part_id_by_name(\"boot\") = 0", last_call());
    EXPECT_EQ(1, get_part_id_by_name("empty"));
    EXPECT_EQ(-1, get_part_id_by_name("bootx"));
    EXPECT_EQ(-1, get_part_id_by_name(""));
    EXPECT_EQ(-1, get_part_id_by_name(nullptr));
    EXPECT_EQ("get_part_id_by_name(null) = -1", last_call());
}

TEST_F(Flash, Read_YieldsTheBytesAndTheirNumber)
{
    EXPECT_EQ(4, i4NFBPartitionRead(0, 0, m_bytes.data(), 4));
    EXPECT_EQ((std::array<UINT8, 4>{ 0x0C, 1, 2, 3 }), m_bytes);
    EXPECT_EQ("i4NFBPartitionRead(0, 0, [0xC, 0x1, 0x2, 0x3], 4) = 4", last_call());
    EXPECT_EQ(2, i4NFBPartitionRead(0, 4, m_bytes.data(), 2));
    EXPECT_EQ((std::array<UINT8, 4>{ 4, 5, 2, 3 }), m_bytes) << "the last bytes, and nothing behind them";
    EXPECT_EQ(0, i4NFBPartitionRead(0, 6, m_bytes.data(), 0));
    EXPECT_EQ("3", now("partitions[0].reads"));
    EXPECT_EQ("0", now("failed_reads"));
}

TEST_F(Flash, Read_OfTheImageAsItIsNow)
{
    i4NFBPartitionRead(0, 0, m_bytes.data(), 1);
    image("boot.bin", "\x12zz");
    EXPECT_EQ(1, i4NFBPartitionRead(0, 0, m_bytes.data(), 1));
    EXPECT_EQ(0x12, m_bytes[0]);
    EXPECT_EQ("3", now("partitions[0].size"));
}

TEST_F(Flash, Read_ThatCannotBeDone_IsNegativeAndLeavesTheDestinationAlone)
{
    const std::array<UINT8, 4> untouched = m_bytes;
    const struct
    {
        INT32 id;
        UINT32 offset, count;
    } reads[] = { { 0, 3, 4 }, { 0, 6, 1 },  { 0, 0xFFFFFFFF, 4 }, { 1, 0, 1 },
                  { 2, 0, 4 }, { -1, 0, 4 }, { 0x7FFFFFFF, 0, 4 }, { -0x7FFFFFFF - 1, 0, 4 } };
    for (const auto& read : reads)
    {
        EXPECT_EQ(-1, i4NFBPartitionRead(read.id, read.offset, m_bytes.data(), read.count)) << read.id << read.offset;
        EXPECT_EQ(untouched, m_bytes);
    }
    EXPECT_EQ("i4NFBPartitionRead(-2147483648, 0, <unchanged>, 4) = -1", last_call());
    EXPECT_EQ("8", now("failed_reads"));
    EXPECT_EQ("0", now("partitions[0].reads"));
    EXPECT_EQ(0u, board::misuses()) << "the caller need not know what is there";
}

TEST_F(Flash, Read_WithoutADestination_IsReported)
{
    EXPECT_EQ(-1, i4NFBPartitionRead(0, 0, nullptr, 4));
    EXPECT_EQ(1u, board::misuses());
}

TEST_F(Flash, Read_OfAWord_IsOfFourBytes)
{
    board::set_flash_word("boot", 0x04030201);
    EXPECT_EQ(2, i4NFBPartitionRead(0, 2, m_bytes.data(), 2));
    EXPECT_EQ((std::array<UINT8, 4>{ 3, 4, 0xAA, 0xAA }), m_bytes);
    EXPECT_EQ(-1, i4NFBPartitionRead(0, 2, m_bytes.data(), 3));
    EXPECT_EQ(-1, i4NFBPartitionRead(0, 0, m_bytes.data(), 0x80000000)) << "a number that no result can tell";
    EXPECT_EQ("2", now("failed_reads"));
    EXPECT_THROW(board::set_flash_word("", 7), std::invalid_argument);
}

TEST_F(Flash, Read_OfAnImageThatIsGone_Fails)
{
    std::filesystem::remove(m_directory / "boot.bin");
    EXPECT_EQ(0, get_part_id_by_name("boot")) << "the partition is there, its content is not";
    EXPECT_EQ(-1, i4NFBPartitionRead(0, 0, m_bytes.data(), 4));
    EXPECT_EQ("null", now("partitions[0].size"));
}

TEST_F(Flash, SetFlash_ReplacesAddsAndRemoves_AndIdsStay)
{
    board::set_flash("more", image("more.bin", "more"));
    EXPECT_EQ(2, get_part_id_by_name("more"));
    board::set_flash("boot", image("other.bin", "\x02zzz"));
    EXPECT_EQ(0, get_part_id_by_name("boot"));
    i4NFBPartitionRead(0, 0, m_bytes.data(), 4);
    EXPECT_EQ(2, m_bytes[0]);
    board::set_flash("boot", {});
    EXPECT_EQ(-1, get_part_id_by_name("boot"));
    EXPECT_EQ(-1, i4NFBPartitionRead(0, 0, m_bytes.data(), 4));
    EXPECT_EQ(2, get_part_id_by_name("more"));
    board::set_flash("boot", {});
    board::set_flash("boot", image("again.bin", "a"));
    EXPECT_EQ(3, get_part_id_by_name("boot"));
}

TEST_F(Flash, SetFlash_RefusesAnImageThatDoesNotExist)
{
    EXPECT_THROW(board::set_flash("boot", m_directory / "nowhere.bin"), std::invalid_argument);
    EXPECT_THROW(board::set_flash("boot", m_directory), std::invalid_argument);
    EXPECT_THROW(board::set_flash("", m_directory / "boot.bin"), std::invalid_argument);
    EXPECT_EQ(4, i4NFBPartitionRead(0, 0, m_bytes.data(), 4)) << "the old image is still there";
}

TEST_F(Flash, State_TellsContentsApart)
{
    const auto content = [] { return now("partitions[0].content"); };
    const std::string first = content();
    EXPECT_EQ(first, content());
    std::filesystem::copy_file(m_directory / "boot.bin", m_directory / "elsewhere.bin");
    board::set_flash("boot", m_directory / "elsewhere.bin");
    EXPECT_EQ(first, content()) << "wherever it lies";
    std::ofstream(m_directory / "elsewhere.bin") << "something else";
    EXPECT_NE(first, content());
    std::filesystem::remove(m_directory / "elsewhere.bin");
    EXPECT_EQ("null", content());
    board::set_flash_word("boot", 7);
    EXPECT_EQ("null", content());
}

TEST_F(Flash, State_TellsThePartitions)
{
    EXPECT_EQ("{partitions=[{id=0, name=\"boot\", image=" + board::quote((m_directory / "boot.bin").string()) +
                  ", size=6, content=\"17892e8ac6561b12\", reads=0}, {id=1, name=\"empty\", image=" +
                  board::quote((m_directory / "e.bin").string()) +
                  ", size=0, content=\"cbf29ce484222325\", reads=0}], failed_reads=0}",
              board::flash::state().to_text());
    power_on({});
    EXPECT_EQ("{partitions=[], failed_reads=0}", board::flash::state().to_text());
    EXPECT_EQ(-1, get_part_id_by_name("boot"));
}

TEST_F(Flash, Faults_AnswerInstead)
{
    answer_always("get_part_id_by_name", 5);
    EXPECT_EQ(5, get_part_id_by_name("boot"));
    answer_always("i4NFBPartitionRead", 4);
    const std::array<UINT8, 4> untouched = m_bytes;
    EXPECT_EQ(4, i4NFBPartitionRead(0, 0, m_bytes.data(), 4));
    EXPECT_EQ(untouched, m_bytes);
    EXPECT_EQ("i4NFBPartitionRead(0, 0, <unchanged>, 4) = 4", last_call());
    EXPECT_EQ("0", now("partitions[0].reads"));
}

} // namespace
