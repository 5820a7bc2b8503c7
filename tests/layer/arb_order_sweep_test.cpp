// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The packed plane order: every mode, every way to name a source twice, every permutation. */
#include <algorithm>
#include <random>

#include "tests/layer/arb_order.h"
#include "tests/layer/mode_facts.h"

namespace
{

using Sources = std::array<unsigned, 8>;

UINT32 packed(const Sources& sources, UINT32 top_bits = 0)
{
    UINT32 order = top_bits & 0x88888888;
    for (unsigned plane = 0; plane < 8; ++plane)
        order |= sources[plane] << (4 * plane);
    return order;
}

} // namespace

TEST_F(ArbOrder, SetArbPlaneOrder_EveryMode_TakesItsOffsets)
{
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        SCOPED_TRACE("mode " + std::to_string(mode));
        set_record("ucMode", mode);
        const Eight& offsets = mode_facts::facts_of(mode).is(mode_facts::tve_hd) ? offsets_hd : offsets_others;
        EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543210));
        EXPECT_TRACE(printed(0, 0x76543210, offsets) + programmed(0, 0x76543210, offsets));
    }
}

TEST_F(ArbOrder, SetArbPlaneOrder_TheModeAtTheTimeOfTheCallDecides)
{
    const std::pair<unsigned, const Eight&> modes[] = { { RES_1080P29_97HZ, offsets_others },
                                                        { RES_1080P24HZ, offsets_hd },
                                                        { RES_576P, offsets_others },
                                                        { RES_PANEL_AUO_B089AW01, offsets_hd },
                                                        { RES_2160P, offsets_others } };
    for (const auto& [mode, offsets] : modes)
    {
        SCOPED_TRACE("mode " + std::to_string(mode));
        set_record("ucMode", mode);
        EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, 0x77777777));
        EXPECT_TRACE(printed(0, 0x77777777, offsets) + refused(0, 1));
    }
}

TEST_F(ArbOrder, SetArbPlaneOrder_EveryPairOfPlanesOnEverySource_IsRefusedByName)
{
    const RecordSnapshot before;
    for (unsigned first = 0; first < 8; ++first)
    {
        for (unsigned second = first + 1; second < 8; ++second)
        {
            for (unsigned source = 0; source < 8; ++source)
            {
                Sources sources{};
                unsigned other = source;
                for (unsigned plane = 0; plane < 8; ++plane)
                    sources[plane] = plane == first || plane == second ? source : ++other % 8;
                const UINT32 order = packed(sources, source % 2 != 0 ? 0x80808080 : 0);
                EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, order));
                EXPECT_TRACE(printed(0, order, offsets_hd) + refused(first, second));
            }
        }
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ArbOrder, SetArbPlaneOrder_SeveralPairs_NamesTheLowestFirstPlaneAndItsLowestPartner)
{
    struct
    {
        UINT32 order;
        std::size_t first;
        std::size_t second;
    } const cases[] = {
        { 0x00000000, 0, 1 }, // planes 0 to 7 on source 0
        { 0x77665541, 2, 3 }, // two planes each, plane 0 and 1 alone
        { 0x33221100, 0, 1 }, // two planes each
        { 0x04321123, 0, 5 }, // 0 and 5 before 1 and 4, 2 and 3
        { 0x01233210, 0, 7 }, // plane 0's partner is the last of all
        { 0x01114562, 4, 5 }, // three planes share
        { 0x89ABCDE6, 0, 1 }, // top bits do not tell sources apart
        { 0x76543280, 0, 1 }, // fields 0 and 8 name one source
        { 0xFEDCBA77, 0, 1 }, // the pair is plain, all others have a top bit
        { 0xF7543210, 6, 7 }, // fields 7 and 15 name one source
    };
    const RecordSnapshot before;
    for (const auto& [order, first, second] : cases)
    {
        EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, order));
        EXPECT_TRACE(printed(0, order, offsets_hd) + refused(first, second));
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ArbOrder, SetArbPlaneOrder_RandomWords_AreRefusedForTheFirstPair)
{
    std::mt19937 random(20);
    for (int i = 0; i < 300; ++i)
    {
        const auto order = static_cast<UINT32>(random());
        const Eight planes = sources(order);
        std::size_t first = 0;
        auto second = planes.end();
        for (; first < 8 && second == planes.end(); ++first)
            second = std::find(planes.begin() + first + 1, planes.end(), planes[first]);
        if (second == planes.end())
            continue;
        EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, order));
        EXPECT_TRACE(printed(0, order, offsets_hd) +
                     refused(first - 1, static_cast<std::size_t>(second - planes.begin())));
    }
    EXPECT_EQ(0x76543210, record("u4PlaneOrder"));
}

/** The permutations that feed plane 0 from one source: an eighth of all 40320. */
class ArbOrderPermutations : public ArbOrder, public testing::WithParamInterface<unsigned>
{
};

TEST_P(ArbOrderPermutations, SetArbPlaneOrder_EveryOne_IsAccepted)
{
    std::mt19937 random(GetParam());
    Sources permutation{ GetParam() };
    unsigned source = 0;
    for (unsigned plane = 1; plane < 8; ++plane, ++source)
        permutation[plane] = source == GetParam() ? ++source : source;

    unsigned accepted = 0;
    do
    {
        const UINT32 order = packed(permutation, static_cast<UINT32>(random()));
        ASSERT_EQ(1u, PMX_SetArbPlaneOrder(0, order)) << std::hex << order;
        ASSERT_EQ(order, record("u4PlaneOrder"));
        const auto& entries = board::trace::entries();
        ASSERT_EQ(31u, entries.size());
        ASSERT_TRUE(entries[17].matches("PMX_HalSetPlaneOrder(0, " + list(sources(order)) + ", *) = 0"))
            << entries[17].brief();
        ASSERT_TRUE(entries[30].matches("_i4OSD_SetPosOffset([2, 8, 10, 0, 0]) = 0")) << entries[30].brief();
        board::trace::clear();

        UINT32 stored = 0;
        ASSERT_EQ(1u, PMX_GetArbPlaneOrder(0, &stored));
        ASSERT_EQ(order, stored);
        const bool warned = board::trace::entries().size() == 4;
        ASSERT_EQ(order != packed(permutation), warned);
        board::trace::clear();
        ++accepted;
    }
    while (std::next_permutation(permutation.begin() + 1, permutation.end()));
    EXPECT_EQ(5040u, accepted);
}

INSTANTIATE_TEST_SUITE_P(SourceOfPlane0, ArbOrderPermutations, testing::Range(0u, 8u));
