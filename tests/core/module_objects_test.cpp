// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The module's objects besides the record: their values at load, the tables that other drivers read.

#include <cstddef>
#include <type_traits>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "drv_if.h"
#include "drv_pmx.h"
#include "pmx_if.h"

using testing::ElementsAre;

namespace
{

// Taken before main(), when nothing has run yet but the loader.
struct AtLoad
{
    PMX_DISPLAY_PART_STATUS_T rStatus = _arPmxDispPartStatus;
    HANDLE_T hMutex = MutexPMX;
    UCHAR ucInitiated = _PmxInitiated;
    INT32 bOnTop = bComp0OnTop;
    BOOL fg2DCap = _fg2DCap;
    BOOL fgTestOsd = _PmxTestOsd;
    BOOL fgBootUp = _fgBootUp;
    UINT32 u4DebugLevel = PMX_debug_level;
};
const AtLoad atLoad;

// Position of a member in a table of functions, counted from 1.
#define SLOT(Table, member) (offsetof(Table, member) / sizeof(void*) + 1)

} // namespace

TEST(ModuleObjects, AtLoad_HandshakeIsClear)
{
    EXPECT_EQ(0u, atLoad.rStatus.hPMXTimer);
    EXPECT_EQ(0u, atLoad.rStatus.fgPmxFormatChangeFlag);
    EXPECT_EQ(0u, atLoad.rStatus.fgPmxEnabeOsdFlag);
    EXPECT_EQ(0u, atLoad.rStatus.fgTimerAlreadySet);
}

TEST(ModuleObjects, AtLoad_LayerIsNotStarted)
{
    EXPECT_EQ(0u, atLoad.hMutex);
    EXPECT_EQ(0u, atLoad.ucInitiated);
}

TEST(ModuleObjects, AtLoad_SwitchesAreOffButBootUp)
{
    EXPECT_EQ(0, atLoad.bOnTop);
    EXPECT_EQ(0u, atLoad.fg2DCap);
    EXPECT_EQ(0u, atLoad.fgTestOsd);
    EXPECT_EQ(1u, atLoad.fgBootUp);
    EXPECT_EQ(0u, atLoad.u4DebugLevel);
}

TEST(ModuleObjects, Types)
{
    EXPECT_TRUE((std::is_same_v<decltype(_arPmxDispPartStatus), PMX_DISPLAY_PART_STATUS_T>));
    EXPECT_TRUE((std::is_same_v<decltype(MutexPMX), HANDLE_T>));
    EXPECT_TRUE((std::is_same_v<decltype(_PmxInitiated), UCHAR>));
    EXPECT_TRUE((std::is_same_v<decltype(bComp0OnTop), INT32>));
    EXPECT_TRUE((std::is_same_v<decltype(_fg2DCap), BOOL>));
    EXPECT_TRUE((std::is_same_v<decltype(_PmxTestOsd), BOOL>));
    EXPECT_TRUE((std::is_same_v<decltype(_fgBootUp), BOOL>));
    EXPECT_TRUE((std::is_same_v<decltype(PMX_debug_level), UINT32>));
    EXPECT_TRUE((std::is_same_v<decltype(pmx_pm_ops), const PM_OPERATIONS_T>));
    EXPECT_TRUE((std::is_same_v<decltype(_rPMXIF), const IPMX>));
    EXPECT_TRUE((std::is_same_v<decltype(szResStr), const CHAR* const[RES_MODE_NUM]>));
}

TEST(ModuleObjects, PowerOperations)
{
    EXPECT_EQ(&i4PMX_Suspend, pmx_pm_ops.suspend);
    EXPECT_EQ(&i4PMX_Resume, pmx_pm_ops.resume);
}

TEST(Gamma, Curves)
{
    EXPECT_THAT(aucGammaCurve, ElementsAre(ElementsAre(0, 99, 136, 163, 186, 206, 224, 240, 255),
                                           ElementsAre(0, 121, 155, 180, 199, 216, 230, 243, 255),
                                           ElementsAre(0, 85, 125, 155, 180, 202, 221, 239, 255),
                                           ElementsAre(0, 100, 137, 164, 187, 206, 224, 240, 255)));
}

TEST(Ipmx, SlotsInTheirOrder)
{
    EXPECT_EQ(1u, SLOT(IPMX, pi4SetMode));
    EXPECT_EQ(2u, SLOT(IPMX, pi4GetMode));
    EXPECT_EQ(3u, SLOT(IPMX, pi4GetOutSize));
    EXPECT_EQ(4u, SLOT(IPMX, pi4GetAspectRatio));
    EXPECT_EQ(5u, SLOT(IPMX, pi4DisableVideoPlane));
    EXPECT_EQ(6u, SLOT(IPMX, pi4EnableVideoPlane));
    EXPECT_EQ(7u, SLOT(IPMX, pi4OsdEnabled));
    EXPECT_EQ(8u, SLOT(IPMX, pi4OsdDisabled));
    EXPECT_EQ(9u, SLOT(IPMX, pi4VdpEnabled));
    EXPECT_EQ(10u, SLOT(IPMX, pi4VdpDisabled));
    EXPECT_EQ(11u, SLOT(IPMX, pi4VdpGetPlanePosition));
    EXPECT_EQ(11 * sizeof(void*), sizeof(IPMX));
}

TEST(Ipmx, SlotsTakeTheTagFirst)
{
    using Colour = DRV_GFX_COLOR_MODE_T;
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4SetMode), INT32 (*)(void*, UCHAR, UCHAR, BOOL)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4GetMode), INT32 (*)(void*, UCHAR*)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4GetOutSize), INT32 (*)(void*, UINT32*, UINT32*)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4GetAspectRatio), INT32 (*)(void*, UINT32*)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4DisableVideoPlane), INT32 (*)(void*, UCHAR)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4EnableVideoPlane), INT32 (*)(void*, UCHAR)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4OsdEnabled), INT32 (*)(void*, INT32, INT32, Colour)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4OsdDisabled), INT32 (*)(void*)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4VdpEnabled), INT32 (*)(void*, INT32, INT32)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4VdpDisabled), INT32 (*)(void*)>));
    EXPECT_TRUE((std::is_same_v<decltype(IPMX::pi4VdpGetPlanePosition), INT32 (*)(void*, UCHAR)>));
}

TEST(Ipmx, SlotsHoldTheAdaptors)
{
    EXPECT_EQ(&i4PmxSetMode, _rPMXIF.pi4SetMode);
    EXPECT_EQ(&i4PmxGetMode, _rPMXIF.pi4GetMode);
    EXPECT_EQ(&i4PmxGetOutSize, _rPMXIF.pi4GetOutSize);
    EXPECT_EQ(&i4PmxGetAspectRatio, _rPMXIF.pi4GetAspectRatio);
    EXPECT_EQ(&i4PmxDisableVideoPlane, _rPMXIF.pi4DisableVideoPlane);
    EXPECT_EQ(&i4PmxEnableVideoPlane, _rPMXIF.pi4EnableVideoPlane);
    EXPECT_EQ(&i4PmxOsdEnabled, _rPMXIF.pi4OsdEnabled);
    EXPECT_EQ(&i4PmxOsdDisabled, _rPMXIF.pi4OsdDisabled);
    EXPECT_EQ(&i4PmxVdpEnabled, _rPMXIF.pi4VdpEnabled);
    EXPECT_EQ(&i4PmxVdpDisabled, _rPMXIF.pi4VdpDisabled);
    EXPECT_EQ(&i4PmxGetPlanePosition, _rPMXIF.pi4VdpGetPlanePosition);
}

TEST(Ipmx, MixerIdIsTheLowByteOfTheTag)
{
    const auto tag = [](std::size_t number) { return reinterpret_cast<void*>(number); };
    EXPECT_EQ(0u, ucPmxIdOfTag(tag(0)));
    EXPECT_EQ(1u, ucPmxIdOfTag(tag(1)));
    EXPECT_EQ(255u, ucPmxIdOfTag(tag(255)));
    EXPECT_EQ(0u, ucPmxIdOfTag(tag(0x100)));
    EXPECT_EQ(0x34u, ucPmxIdOfTag(tag(0xFFFF1234)));
}
