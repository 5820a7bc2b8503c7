// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include "drv_if.h"
#include "drv_if_pmx.h"
#include "drv_if_vdp.h"

namespace
{

const IVdp interface_test_table = {};

class InterfaceManager : public DeviceTest
{
protected:
    static void* tag(std::uintptr_t number) { return reinterpret_cast<void*>(number); }

    static INT32 publish()
    {
        return i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 1, IID_IVdp, &interface_test_table, tag(7));
    }
    INT32 query() { return i4ImQueryInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, &m_table, &m_tag); }
    static INT32 release(std::uintptr_t number)
    {
        return i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, tag(number));
    }
    static INT32 withdraw() { return i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, 1, IID_IVdp); }

    static std::string now() { return board::interface_manager::state().to_text(); }

    void* m_table = tag(0x11);
    void* m_tag = tag(0x22);
};

TEST_F(InterfaceManager, Published_IsFetchedHeldAndGivenBack)
{
    EXPECT_EQ(0, publish());
    EXPECT_EQ("i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 1, IID_IVdp, interface_test_table, 7) = 0", last_call());
    EXPECT_EQ(0, query());
    EXPECT_EQ("i4ImQueryInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, interface_test_table, 7) = 0", last_call());
    EXPECT_EQ(&interface_test_table, m_table);
    EXPECT_EQ(tag(7), m_tag);
    EXPECT_EQ(0, query());
    EXPECT_EQ("{interfaces=[{component_type=PMX_COMP_TYPE_VDP, component_id=1, interface_id=IID_IVdp, "
              "table=interface_test_table, tag=7, held=2}]}",
              now());
    EXPECT_EQ(0, release(7));
    EXPECT_EQ("i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, 7) = 0", last_call());
    EXPECT_EQ(0, release(7));
    EXPECT_EQ(0, withdraw());
    EXPECT_EQ("i4ImUnregisterInterface2(PMX_COMP_TYPE_VDP, 1, IID_IVdp) = 0", last_call());
    EXPECT_EQ("{interfaces=[]}", now());
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(InterfaceManager, PublishedTwice_Fails)
{
    publish();
    EXPECT_EQ(-1, i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 1, IID_IVdp, &interface_test_table, tag(8)));
    query();
    EXPECT_EQ(tag(7), m_tag) << "the first one stays";
    EXPECT_EQ(0, i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 2, IID_IVdp, &interface_test_table, tag(8)));
    EXPECT_EQ(0, i4ImRegisterInterface2(PMX_COMP_TYPE_OSD, 1, IID_IVdp, &interface_test_table, tag(8)));
    EXPECT_EQ(0, i4ImRegisterInterface2(PMX_COMP_TYPE_VDP, 1, IID_IPMX, &interface_test_table, tag(8)));
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(InterfaceManager, WhatIsMissing_FailsAndYieldsNothing)
{
    EXPECT_EQ(-1, query());
    EXPECT_EQ("i4ImQueryInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, <unchanged>, <unchanged>) = -1", last_call());
    EXPECT_EQ(tag(0x11), m_table);
    EXPECT_EQ(tag(0x22), m_tag);
    EXPECT_EQ(-1, withdraw());
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(InterfaceManager, Release_ThatDoesNotFit_IsReported)
{
    EXPECT_EQ(-1, release(7));
    EXPECT_EQ("NOTICE misuse \"i4ImReleaseInterface: PMX_COMP_TYPE_VDP 1 IID_IVdp is not registered\"", last_call());
    publish();
    EXPECT_EQ(-1, release(7));
    EXPECT_EQ("NOTICE misuse \"i4ImReleaseInterface: PMX_COMP_TYPE_VDP 1 IID_IVdp is not held\"", last_call());
    query();
    EXPECT_EQ(-1, release(8));
    EXPECT_EQ("NOTICE misuse \"i4ImReleaseInterface: PMX_COMP_TYPE_VDP 1 IID_IVdp has another tag\"", last_call());
    EXPECT_EQ(3u, board::misuses());
    EXPECT_EQ(0, release(7));
}

TEST_F(InterfaceManager, WithdrawnWhileHeld_IsReported)
{
    publish();
    query();
    EXPECT_EQ(0, withdraw());
    EXPECT_EQ("NOTICE misuse \"i4ImUnregisterInterface2: PMX_COMP_TYPE_VDP 1 IID_IVdp is withdrawn while it is held 1 "
              "times\"",
              last_call());
    EXPECT_EQ("{interfaces=[]}", now());
}

TEST_F(InterfaceManager, NotGivenBack_IsReportedWhenTheOutermostOperationEnds)
{
    publish();
    {
        const board::trace::Operation outer("PMX_OsdEnabled");
        {
            const board::trace::Operation inner("PMX_InformVdpColorSpace");
            query();
        }
        EXPECT_EQ(0u, board::misuses()) << "only the outermost operation counts";
    }
    EXPECT_EQ("NOTICE misuse \"i4ImQueryInterface: PMX_COMP_TYPE_VDP 1 IID_IVdp is not given back by PMX_OsdEnabled\"",
              last_call());
    EXPECT_EQ("PMX_OsdEnabled", board::trace::entries().back().operation);
    EXPECT_EQ(1u, board::misuses());
    {
        const board::trace::Operation next("PMX_OsdDisabled");
        query();
        release(7);
    }
    EXPECT_EQ(1u, board::misuses()) << "it is not blamed on another operation";
}

TEST_F(InterfaceManager, GivenBack_OrHeldFromBefore_IsNotReported)
{
    publish();
    query(); // its holder has it across operations
    {
        const board::trace::Operation scope("PMX_OsdEnabled");
        query();
        release(7);
    }
    {
        const board::trace::Operation scope("PMX_OsdEnabled");
        release(7);
    }
    {
        const board::trace::Operation scope("PMX_OsdEnabled");
        query();
        board::faults::set({ "i4ImReleaseInterface", -1, board::Fault::When::On, 1 });
        release(7); // a fault answered: that is not the holder's
    }
    EXPECT_EQ(0u, board::misuses());
    EXPECT_EQ("1", member(board::interface_manager::state(), "interfaces[0].held"));
    {
        const board::trace::Operation scope("PMX_OsdEnabled");
        query();
    }
    EXPECT_EQ(1u, board::misuses()) << "that fault excuses nobody later";
}

TEST_F(InterfaceManager, GivenBackWithAnotherTag_IsNotGivenBack)
{
    publish();
    {
        const board::trace::Operation scope("PMX_OsdEnabled");
        query();
        release(8);
        EXPECT_EQ(1u, board::misuses());
    }
    EXPECT_EQ(2u, board::misuses());
}

TEST_F(InterfaceManager, NullPointers_AreReported)
{
    EXPECT_EQ(-1, i4ImRegisterInterface2(1, 2, 3, nullptr, nullptr));
    EXPECT_EQ("NOTICE misuse \"i4ImRegisterInterface2: the table of 1 2 3 is a null pointer\"", last_call());
    publish();
    EXPECT_EQ(-1, i4ImQueryInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, nullptr, &m_tag));
    EXPECT_EQ(-1, i4ImQueryInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, &m_table, nullptr));
    EXPECT_EQ(3u, board::misuses());
    EXPECT_EQ("0", member(board::interface_manager::state(), "interfaces[0].held"));
}

TEST_F(InterfaceManager, Faults_AnswerInsteadOfActing)
{
    answer_always("i4ImRegisterInterface2", -2);
    EXPECT_EQ(-2, publish());
    EXPECT_EQ("{interfaces=[]}", now());
    board::faults::clear_all();
    publish();
    answer_always("i4ImQueryInterface", -3);
    EXPECT_EQ(-3, query());
    EXPECT_EQ("i4ImQueryInterface(PMX_COMP_TYPE_VDP, 1, IID_IVdp, <unchanged>, <unchanged>) = -3", last_call());
    EXPECT_EQ(tag(0x11), m_table);
    board::faults::set({ "i4ImQueryInterface", 2, board::Fault::When::Always, 1, {}, {}, { { "ppvTag", "0x33" } } });
    EXPECT_EQ(2, query());
    EXPECT_EQ(tag(0x33), m_tag);
    EXPECT_EQ(0, release(7));
    board::faults::clear_all();
    query();
    answer_always("i4ImReleaseInterface", -4);
    EXPECT_EQ(-4, release(7));
    answer_always("i4ImUnregisterInterface2", -5);
    EXPECT_EQ(-5, withdraw());
    EXPECT_EQ("1", member(board::interface_manager::state(), "interfaces[0].held"));
    EXPECT_EQ(-4, i4ImReleaseInterface(PMX_COMP_TYPE_VDP, 9, IID_IVdp, tag(7))) << "which nobody has";
    power_on({});
    EXPECT_EQ("{interfaces=[]}", now());
}

} // namespace
