// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The mixer layer: every function that it offers, with its contract. This is the header that a caller includes.
 *
 *  One mixer exists, id 0. Unless its contract says otherwise a function answers 1 when it has done its work, and 0
 *  when it has refused to and changed nothing. An id that goes unchecked is taken for mixer 0.
 *  Pointers are tested for null where the contract says so, and only there.
 *
 *  Nobody calls i4Pmx_Connect, i4Pmx_Disconnect, PMX_VdpEnabled, PMX_OsdEnabled, PMX_OsdDisabled,
 *  PMX_DecideMasterColorSpace or PMX_InformVdpColorSpace while holding a lock that a video plane's pu4SetColorMode
 *  takes: all of them can take MutexPMX, and pu4SetColorMode is called with it held.
 *
 *  Functions i4Pmx… behind the IPMX table find the mixer id in the low 8 bits of their tag. */
#ifndef DRV_PMX_H
#define DRV_PMX_H

#include "drv_if_pmx.h"
#include "x_plane_mxr.h"
#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Success of PMX_SetTvType and of the mode settings. */
#define PMX_SET_OK 1

/** TV types: systems with 60 and with 50 fields a second. */
#define PMX_TV_TYPE_NTSC 0
#define PMX_TV_TYPE_PAL 3

/* Life cycle and power */

/** Start the layer: create its mutex and timer, load record and hardware with the defaults, register the IPMX table and
 *  the power-management operations. Only logs when it has been started already. A failing operating-system call is
 *  reported by Assert and start-up goes on.
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API void PMX_Init(void);

/** Reload the default record, take the boot resolution and program the hardware for it. Until the first per-output mode
 *  setting (_fgBootUp) scaler and TV encoder keep what the boot loader set. Every input port is unconnected afterwards.
 *  Clears the handshake, its timer's handle included: after a reset of a started layer the stack alone knows the timer,
 *  which may be running and which PMX_Uninit cannot delete; starting or deleting it fails with an Assert.
 *  @param ucPmxId  mixer id, 0; for any other nothing is done
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API void PMX_Reset(UCHAR ucPmxId);

/** Shut the layer down: withdraw power management and the IPMX table, delete timer and mutex. A timer or mutex that
 *  cannot be deleted is reported by Assert, a table that cannot be withdrawn in the log. Only logs unless the layer has
 *  been started.
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API void PMX_Uninit(void);

/** Shut the layer down, and tell how that went. Unlike PMX_Uninit it leaves power management registered,
 *  deletes the mutex only if there is one, and reports its failed deletion by the result instead of Assert; MutexPMX
 *  then keeps its handle. A timer that cannot be deleted is reported by Assert, a table that cannot be withdrawn in the
 *  log. Whatever fails, the layer counts as not started afterwards: a second call deletes nothing, and returns 0.
 *  @param u4Case  why; only logged
 *  @return 0, also when the layer had not been started; -1 when the mutex could not be deleted
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API INT32 i4PMX_Uninit(UINT32 u4Case);

/** Stop vertical-sync handling and mark the layer as not started. Nothing else is undone: shutting down finds nothing
 *  to do from then on, and another PMX_Init makes a second mutex and timer beside the first, which stay with the stack,
 *  and registers table and power management again.
 *  @context the framework's thread, with no other mixer call running */
PMX_API void PMX_Stop(void);

/** Gate the mixer's clocks; the suspend member of pmx_pm_ops. The record is left alone.
 *  @param[in] param  [tag] ignored
 *  @return 0
 *  @context the kernel's power management */
PMX_API int i4PMX_Suspend(void* param);

/** Run the mixer's clocks again; the resume member of pmx_pm_ops. The record is left alone.
 *  @param[in] param  [tag] ignored
 *  @return 0
 *  @context the kernel's power management */
PMX_API int i4PMX_Resume(void* param);

/** Register the IPMX table at the interface manager.
 *  @param u2CompType  component type, a PMX_COMP_TYPE_ value: 66 for the mixer
 *  @param u2CompId    component id, 0; it is also the tag that the table's users hand back
 *  @return the interface manager's result, negative on a failure
 *  @context a thread that may sleep */
PMX_API INT32 i4PmxRegisterIM(UINT16 u2CompType, UINT16 u2CompId);

/** Withdraw the IPMX table from the interface manager.
 *  @param u2CompType  component type, a PMX_COMP_TYPE_ value: 66 for the mixer
 *  @param u2CompId    component id, 0
 *  @return the interface manager's result, negative on a failure
 *  @context a thread that may sleep */
PMX_API INT32 i4PmxUnregisterIM(UINT16 u2CompType, UINT16 u2CompId);

/* Master enable, capability, second video plane */

/** Read the capability word.
 *  @param      ucPmxId  mixer id, 0
 *  @param[out] pu4Cap   receives it: bits below 20 admit groups of resolution modes, those from 20 on features
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetCap(UCHAR ucPmxId, UINT32* pu4Cap);

/** Switch the mixer's output on or off. Switching on applies the digital port's settings from the record.
 *  @param ucPmxId   mixer id, 0
 *  @param ucEnable  0 off, anything else on; stored as given, so a different non-zero value switches on again
 *  @return 1, also when the value is the stored one and nothing is done; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetEnable(UCHAR ucPmxId, UCHAR ucEnable);

/** Read the master enable.
 *  @param      ucPmxId    mixer id, 0
 *  @param[out] pucEnable  receives the value last given to PMX_SetEnable, 0 after a reset
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetEnable(UCHAR ucPmxId, UCHAR* pucEnable);

/** Put the video plane that sits in the second mixer plane into the mix. The first mixer plane is never switched here.
 *  @param ucPmxId  mixer id, handed on unchecked
 *  @param ucVdpId  the plane that sits there: 1, or instead 0 while the hardware swaps the two; for any other nothing
 *                  is done
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_EnableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId);

/** Take the video plane that sits in the second mixer plane out of the mix. The first mixer plane is never switched
 *  here.
 *  @param ucPmxId  mixer id, handed on unchecked
 *  @param ucVdpId  the plane that sits there: 1, or instead 0 while the hardware swaps the two; for any other nothing
 *                  is done
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_DisableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId);

/** IPMX: PMX_EnableVideoPlane.
 *  @param[in] pvTag    [tag] the table's tag
 *  @param     ucVdpId  video plane
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxEnableVideoPlane(void* pvTag, UCHAR ucVdpId);

/** IPMX: PMX_DisableVideoPlane.
 *  @param[in] pvTag    [tag] the table's tag
 *  @param     ucVdpId  video plane
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxDisableVideoPlane(void* pvTag, UCHAR ucVdpId);

/* Boot resolution, video PLL, TV type */

/** Read the boot resolution from the partition "fast_init_param", where a boot loader leaves it.
 *  @return the low byte of the partition's first word, a PMX_RESOLUTION_MODE_T value that nobody has validated;
 *          RES_480I when the partition is missing or cannot be read
 *  @context a thread that may sleep */
PMX_API UINT8 PMX_GetHDMIDefaultRes(void);

/** Set the video PLL's synthesiser word that a mode needs.
 *  @param bResIndex  a PMX_RESOLUTION_MODE_T value; any other takes the word of the 50 Hz and 24 Hz modes
 *  @context a thread that may sleep: waits twice for 1 ms */
PMX_API void vSetPLLGP_HDMIDDS(BYTE bResIndex);

/** Store and program the TV type.
 *  @param ucPmxId   mixer id, 0
 *  @param ucTvType  a PMX_TV_TYPE_ value; any other goes into the record and to the hardware unchanged
 *  @return PMX_SET_OK; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType);

/** Read the TV type.
 *  @param      ucPmxId    mixer id, 0
 *  @param[out] pucTvType  receives a PMX_TV_TYPE_ value, or whatever was given
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetTvType(UCHAR ucPmxId, UCHAR* pucTvType);

/* Diagnostics */

/** The module's own formatted print, admitted by bit `level` of PMX_debug_level. The text is cut to 511 characters and
 *  goes to the console as a format: a percent sign in it, wherever it came from, is interpreted once more.
 *  @param     level          0 to 31; any other prints nothing
 *  @param[in] format_string  [text] printf format
 *  @context any thread; takes no lock, needs 512 bytes of stack */
PMX_API void PMX_Printf(INT32 level, const char* format_string, ...) DRV_PRINTF_FORMAT(2, 3);

/** Print the record of mixer 0 to the console at level 0. What is labelled E is the digital port's bus width: the
 *  master enable is not shown. A value without a name has no line. Takes no lock: while a mode is being set, some lines
 *  may show what was and others what will be.
 *  @context any thread */
PMX_API void PMX_QueryStatus(void);

/* Mode */

/** Ask whether a resolution mode is admitted by the capability word.
 *  @param ucPmxId  mixer id, unchecked
 *  @param ucMode   a PMX_RESOLUTION_MODE_T value; some are admitted, some refused whatever the capability word says
 *  @return 1 admitted, 0 refused
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_CheckCap(UCHAR ucPmxId, UCHAR ucMode);

/** Set one resolution mode on all outputs. An unchanged mode and frequency only repeat the notices to the OSD and video
 *  plane drivers, once a mode has been set.
 *  @param ucPmxId  mixer id, 0
 *  @param ucMode   a PMX_RESOLUTION_MODE_T value
 *  @param ucVFreq  vertical frequency in Hz: exactly 60 selects NTSC and 480i on composite, any other PAL and 576i
 *  @param fgOSD5   fifth-OSD mode 0, 1 or 2; for the TV encoders alone, not stored
 *  @return PMX_SET_OK; 0 for a mixer id other than 0 or a mode that PMX_CheckCap refuses
 *  @context a thread that may sleep; takes no lock: no other mode change may run */
PMX_API UINT32 PMX_SetMode(UCHAR ucPmxId, UCHAR ucMode, UCHAR ucVFreq, UINT8 fgOSD5);

/** IPMX: PMX_SetMode.
 *  @param[in] pvTag    [tag] the table's tag
 *  @param     ucMode   a PMX_RESOLUTION_MODE_T value
 *  @param     ucVFreq  vertical frequency in Hz
 *  @param     fgOSD5   fifth-OSD mode 0, 1 or 2; for the TV encoders alone, not stored
 *  @return PMX_SET_OK; 0 for a tag whose low 8 bits are not 0, or a refused mode
 *  @context a thread that may sleep; takes no lock: no other mode change may run */
PMX_API INT32 i4PmxSetMode(void* pvTag, UCHAR ucMode, UCHAR ucVFreq, BOOL fgOSD5);

/** Set the state of all four outputs. The first enabled one of digital port, HDMI, component and composite gives the
 *  mixer's format, HDMI's when none is enabled. HDMI, component and composite run it while they are off; the record
 *  keeps what the caller gave. Ends by deciding whether graphics wait for the display part: see
 *  PMX_SetFormatChangeFlag. A refused format lowers the format-change flag and stores nothing. Only the mixer's format
 *  is checked: what the other outputs were given goes to their drivers unchecked, cut to 8 bits.
 *  @param     ucPmxId     mixer id, 0
 *  @param[in] prOutConf   [PMX_OUTPUT_NUM] four outputs, indexed PMX_OUTPUT_CCIR to PMX_OUTPUT_CVBS; fgOutputEnable and
 *                         eResMode of each are used, and eCcirDrvInfo of PMX_OUTPUT_CCIR; u4VFreq is not. Read once,
 *                         before the first log line: what becomes of it afterwards changes nothing
 *  @param     ucVFreq     vertical frequency of all outputs in Hz: 60, 30, 29, 23 and 0 select NTSC, any other PAL
 *  @param     rDrvExtScl  how the external chip is used; a change programs everything
 *  @param     fgOSD5      fifth OSD plane asked for on the analogue outputs: 0 no, 1 composite, 2 both. An HD mixer
 *                         format shows it on composite in any case, and on both when component's mode is not HD
 *  @return PMX_SET_OK; 0 for a mixer id other than 0, a null pointer or a mixer format that PMX_CheckCap refuses
 *  @context a thread that may sleep; takes no lock: no other mode change may run, the display timer may expire at any
 *           point */
PMX_API UINT32 PMX_SetModeEx(UCHAR ucPmxId, PMX_RESOLUTION_T* prOutConf, UCHAR ucVFreq, DRV_EXT_CHIP_USAGE_T rDrvExtScl,
                             UINT8 fgOSD5);

/** Read the mixer's resolution mode.
 *  @param      ucPmxId  mixer id, 0
 *  @param[out] pucMode  receives a PMX_RESOLUTION_MODE_T value
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetMode(UCHAR ucPmxId, UCHAR* pucMode);

/** IPMX: PMX_GetMode.
 *  @param[in]  pvTag    [tag] the table's tag
 *  @param[out] pucMode  receives a PMX_RESOLUTION_MODE_T value
 *  @return 1; 0 for a tag whose low 8 bits are not 0, or a null pointer
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetMode(void* pvTag, UCHAR* pucMode);

/** Read the force-mode flag. It is kept for its readers; no mode setting looks at it.
 *  @param ucPmxId  mixer id, unchecked
 *  @return 1 set, 0 clear
 *  @context any thread; takes no lock */
PMX_API BOOL PMX_IsForceMode(UCHAR ucPmxId);

/** Set or clear the force-mode flag.
 *  @param ucPmxId  mixer id, unchecked
 *  @param fgOn     0 clear, anything else set
 *  @context any thread; takes no lock */
PMX_API void PMX_SetForceMode(UCHAR ucPmxId, BOOL fgOn);

/* Display-part handshake. The display part raises the format-change flag and lowers it when it is done. The layer
 * lowers it as well (its timer, nothing to wait for, a refused format) and never raises it. Per-output mode setting
 * takes planes 2 to 6 out of the mix when it ends with the flag raised. */

/** Raise or lower the format-change flag. Raising changes nothing else. Lowering owes the OSD planes their return to
 *  the mix: at once, or, while the video plane driver waits for its sync control, by its PMX_SetOsdEnable.
 *  @param bIsFormatChange  TRUE when the display part starts to switch format, FALSE when it is done
 *  @return 1
 *  @context any thread, and the timer's; any time */
PMX_API UINT32 PMX_SetFormatChangeFlag(BOOL bIsFormatChange);

/** Note or forget that PMX_SetOsdEnable owes the OSD planes their return.
 *  @param bIsOsdEnable  TRUE or FALSE
 *  @return 1
 *  @context any thread, and the timer's */
PMX_API UINT32 PMX_SetOsdEnableFlag(BOOL bIsOsdEnable);

/** Mix the OSD planes again if they are owed it; for whoever held them back, once it is ready.
 *  @return 1
 *  @context any thread, and the timer's; any time */
PMX_API UINT32 PMX_SetOsdEnable(void);

/** Expiry function of the display timer: the display part never answered, or has long answered; lowers the flag.
 *  @param     h      ignored
 *  @param[in] pvArg  [tag] ignored
 *  @context the timer's */
PMX_API void _PMX_TmrIsr(HANDLE_T h, void* pvArg);

/** Start the display timer anew. Failures of the timer are reported by Assert.
 *  @param u4TimeInterval  milliseconds; fgTimerAlreadySet is left to per-output mode setting
 *  @return 1
 *  @context any thread */
PMX_API UINT32 PMX_SetFormatChangeTimer(UINT32 u4TimeInterval);

/** Ask whether the display part has finished switching format.
 *  @return 1 ready, 0 the format-change flag is raised
 *  @context any thread, and the timer's */
PMX_API BOOL fgPMX_DisplayModeReady(void);

/* Colour conversions */

/** Convert from the mixer's colour space to that of the output's standard: BT.601 for SD, BT.709 for HD. Nothing is
 *  cached: the same call twice programs twice. A colour space other than BT.601 or BT.709 is logged, reported by
 *  Assert, and leaves the converters alone; so do, silently, modes without a setting.
 *  @param eMixerOutCS   the mixer's colour space
 *  @param ucOutputMode  a PMX_RESOLUTION_MODE_T value
 *  @context any thread that may sleep; takes no lock */
PMX_API void PMX_ColorSpaceSetup(DRV_PMX_COLOR_SPACE_T eMixerOutCS, UCHAR ucOutputMode);

/* Geometry */

/** Read the size of the mixer's picture in its resolution mode. The 1440 and 2880 modes count 720 pixels.
 *  RES_2D_576I50HZ counts 1920 x 1080, and so does every number without a row in the mode table.
 *  @param      ucPmxId    mixer id, 0
 *  @param[out] pu4Width   receives the width in pixels
 *  @param[out] pu4Height  receives the height in lines of a frame
 *  @return 1; 0 for a mixer id other than 0 or if either pointer is null, and then neither is written
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetOutSize(UCHAR ucPmxId, UINT32* pu4Width, UINT32* pu4Height);

/** IPMX: PMX_GetOutSize.
 *  @param[in]  pvTag      [tag] the table's tag
 *  @param[out] pu4Width   receives the width in pixels
 *  @param[out] pu4Height  receives the height in lines of a frame
 *  @return 1; 0 for a tag whose low 8 bits are not 0, or if either pointer is null, and then neither is written
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetOutSize(void* pvTag, UINT32* pu4Width, UINT32* pu4Height);

/** Ask whether the mixer's resolution mode is reported as progressive.
 *  @param ucPmxId  mixer id, 0
 *  @return 1 or 0; 0 for a mixer id other than 0. RES_1080P23_976HZ, RES_1080P29_97HZ, the top-and-bottom modes and
 *          every number without a row in the mode table count as 0
 *  @context any thread; takes no lock */
PMX_API UCHAR PMX_ProgressiveOut(UCHAR ucPmxId);

/** Ask whether the mixer's resolution mode is reported as an HD output. Not the HD formats of the TV encoders:
 *  RES_1080P29_97HZ, RES_2D_576I50HZ and every number without a row in the mode table count here.
 *  @param ucPmxId  mixer id, unchecked
 *  @return TRUE or FALSE
 *  @context any thread; takes no lock */
PMX_API BOOL fgPmxFmtHDOutput(UCHAR ucPmxId);

/* TV system, handed to the HDMI/AV driver */

/** Tell the HDMI/AV driver the TV system chosen by the user.
 *  @param ucPmxId      mixer id, 0
 *  @param u2VSyncFreq  vertical frequency in Hz: 50, 60, 24, 30 or 25
 *  @param fgTvSysAuto  the sink decides, not the user
 *  @return 1, whatever the driver answers; 0 for a mixer id other than 0 or another frequency
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetTVSystem(UCHAR ucPmxId, UINT16 u2VSyncFreq, BOOL fgTvSysAuto);

/** Ask the HDMI/AV driver what it would choose for a resolution and frequency.
 *  @param      ucPmxId                   mixer id, 0
 *  @param      ucChkRes                  a PMX_RESOLUTION_MODE_T value
 *  @param      u2VSyncFreq               vertical frequency in Hz
 *  @param[out] ucSupportedAutoRes        receives a PMX_RESOLUTION_MODE_T value, the driver's cut to 8 bits; not
 *                                        tested for null
 *  @param[out] ucSupportedAutoVsyncFreg  receives the frequency in Hz; not tested for null
 *  @return 1; 0 for a mixer id other than 0 or when the driver has no answer, and then nothing is written
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_ChkSupportedRes(UCHAR ucPmxId, UCHAR ucChkRes, UINT16 u2VSyncFreq, UCHAR* ucSupportedAutoRes,
                                   UINT16* ucSupportedAutoVsyncFreg);

/** Have the HDMI/AV driver change the deep colour.
 *  @param ucPmxId      mixer id, 0
 *  @param ucDeepColor  the driver's code
 *  @return 1 when the driver does it, and also for a mixer id other than 0, for which nothing is done; else 0
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetHdmiDeepColor(UCHAR ucPmxId, UCHAR ucDeepColor);

/** Tell the HDMI/AV driver whether the user chose the automatic resolution.
 *  @param fgIsAuto  TRUE or FALSE
 *  @context a thread that may sleep; takes no lock */
PMX_API void PMX_RecordUiResAuto(BOOL fgIsAuto);

/* Plane order */

/** Set the background colour.
 *  @param ucPmxId    mixer id, 0
 *  @param u4BgColor  0x00YYUUVV
 *  @return 1; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetBg(UCHAR ucPmxId, UINT32 u4BgColor);

/** Set the whole stacking order.
 *  @param     ucPmxId        mixer id, 0
 *  @param[in] pu4PlaneOrder  [8] eight plane ids, position 0 first; the record keeps their low 8 bits, the hardware
 *                            gets the words as given
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetPlaneOrderArray(UCHAR ucPmxId, const UINT32* pu4PlaneOrder);

/** Put one plane at one position. It is not removed from where it stood: moving a plane takes two calls, one for each
 *  position.
 *  @param ucPmxId       mixer id, 0
 *  @param ucVdpId       plane id
 *  @param ucPlaneOrder  position 0 to 7
 *  @return 1; 0 for a mixer id other than 0 or a position above 7
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetPlaneOrder(UCHAR ucPmxId, UCHAR ucVdpId, UCHAR ucPlaneOrder);

/** Find a plane's position.
 *  @param      ucPmxId        mixer id, 0
 *  @param      ucVdpId        plane id
 *  @param[out] pucPlaneOrder  receives the lowest position that holds the plane, or 8 when none does
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetPlaneOrder(UCHAR ucPmxId, UCHAR ucVdpId, UCHAR* pucPlaneOrder);

/** Choose which of the two video planes is on top, by the hardware's swap of planes 1 and 2. The second mixer plane is
 *  then mixed exactly if the video plane that has come there is enabled or hidden. The choice outlives a reset of the
 *  record.
 *  @param ucPmxId  mixer id, handed on unchecked
 *  @param u4OnTop  0 below, anything else above; stored unchanged, and the colour bar looks for 1 and nothing else
 *  @return 1
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetOrderVdpComp0(UCHAR ucPmxId, UINT32 u4OnTop);

/** Queue command 17 for video planes 0, 1 and 2, then PMX_SetOrderVdpComp0.
 *  @param ucPmxId  mixer id, handed on unchecked
 *  @param u4OnTop  0 below, anything else above
 *  @return 1
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 d_PMX_SetOrderVdpComp0(UCHAR ucPmxId, UINT32 u4OnTop);

/** Read what PMX_SetOrderVdpComp0 was last given, 0 at load.
 *  @param      ucPmxId   mixer id, unchecked
 *  @param[out] pu4OnTop  receives it; not tested for null
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API UINT32 d_PMX_GetOrderVdpComp0(UCHAR ucPmxId, UINT32* pu4OnTop);

/** Ask in which mixer plane a video plane sits; the hardware's swap of planes 1 and 2 decides.
 *  @param ucPmxId    mixer id, handed on unchecked
 *  @param ucVdpHwId  video plane 0 or 1; any other is logged, reported by Assert and answered with DRV_PMX_PLANE_1
 *  @return a DRV_PMX_PLANE_T value
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_VdpGetPlanePosition(UCHAR ucPmxId, UCHAR ucVdpHwId);

/** IPMX: PMX_VdpGetPlanePosition.
 *  @param[in] pvTag      [tag] the table's tag
 *  @param     ucVdpHwId  video plane 0 or 1
 *  @return a DRV_PMX_PLANE_T value
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetPlanePosition(void* pvTag, UCHAR ucVdpHwId);

/* Arbitrary plane order */

/** Feed each mixer plane from one source, and compensate the delays that follow, by what suits the mode of the moment:
 *  no mode setting does it again. Prints 17 lines whatever the console's level.
 *  @param ucPmxId       mixer id, unchecked; printed and handed on as given
 *  @param u4PlaneOrder  4 bits a plane, plane 0 lowest: the low three name the source 0 to 7, the top one is kept but
 *                       not used. All sources differ
 *  @return 1; 0 when two planes name one source, and then nothing has changed; 0 also when the hardware refuses the
 *          order, which then stays stored
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetArbPlaneOrder(UCHAR ucPmxId, UINT32 u4PlaneOrder);

/** Read the arbitrary plane order last stored; a difference from the hardware's is logged.
 *  @param      ucPmxId        mixer id, unchecked; printed and handed on as given
 *  @param[out] pu4PlaneOrder  receives the stored order; not tested for null
 *  @return 1; 0 when the hardware cannot report its order, and then nothing is written
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_GetArbPlaneOrder(UCHAR ucPmxId, UINT32* pu4PlaneOrder);

/* Plane swap, colour bar, mute */

/** Swap two mixer planes in the hardware, or undo it. The state lives in the hardware alone; swapping planes 1 and 2
 *  here does not count as "first video on top".
 *  @param ucPmxId     mixer id, 0
 *  @param ucEnable    0 undo, anything else swap
 *  @param ucSwapMode  1: planes 1,2   2: 3,4   3: 6,7   4: 4,7   5: 1,3   6: 5,8   anything else: nothing is done
 *  @return 1, also for an unknown swap mode; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetSwapEnable(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucSwapMode);

/** Ask the hardware whether two planes are swapped.
 *  @param      ucPmxId     mixer id, 0
 *  @param[out] pucEnable   receives TRUE or FALSE; not tested for null, not written for an unknown swap mode
 *  @param      ucSwapMode  as for PMX_SetSwapEnable
 *  @return 1, also for an unknown swap mode; 0 for a mixer id other than 0
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetSwapEnable(UCHAR ucPmxId, UCHAR* pucEnable, UCHAR ucSwapMode);

/** Switch the test colour bar. While it is shown, "first video on top" is suspended.
 *  @param ucPmxId   mixer id, 0
 *  @param ucEnable  0 off, anything else on; kept as given: the mute hides and restores the bar for exactly 1
 *  @return 1, also when the value is the stored one and nothing is done; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetCBEnable(UCHAR ucPmxId, UCHAR ucEnable);

/** Read the colour bar's switch.
 *  @param      ucPmxId    mixer id, 0
 *  @param[out] pucEnable  receives the value last given, also while a mute hides the bar
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetCBEnable(UCHAR ucPmxId, UCHAR* pucEnable);

/** Mute the mixer's output; hides a colour bar while it lasts.
 *  @param ucPmxId   mixer id, 0
 *  @param ucEnable  0 release, anything else mute
 *  @return 1, also when the value is the stored one and nothing is done; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetMuteEnable(UCHAR ucPmxId, UCHAR ucEnable);

/** Read the mute.
 *  @param      ucPmxId    mixer id, 0
 *  @param[out] pucEnable  receives the value last given
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetMuteEnable(UCHAR ucPmxId, UCHAR* pucEnable);

/** Fit the hardware's active zone to a resolution mode.
 *  @param ucPmxId  mixer id, handed on unchecked
 *  @param ucMode   a PMX_RESOLUTION_MODE_T value, handed on unchecked
 *  @return 1
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetActiveZone(UCHAR ucPmxId, UCHAR ucMode);

/** Set a video path's delay in the hardware.
 *  @param ucVdoId   video path
 *  @param ucADJ_F   field adjustment
 *  @param u2HDelay  horizontal delay in the hardware's unit
 *  @param u2VDelay  vertical delay in the hardware's unit
 *  @return 1
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDelay(UCHAR ucVdoId, UCHAR ucADJ_F, UINT16 u2HDelay, UINT16 u2VDelay);

/* Source ports */

/** Results of connecting and disconnecting, as the framework numbers them. */
#define PMX_PORT_DONE 0x71000000u
#define PMX_NO_SUCH_PORT 0xF1000002u

/** Find the input port of an upstream component. A type that has no ports is logged, an id beyond them is not.
 *  @param u2CompType  a PMX_COMP_TYPE_ value, of a video plane or an OSD plane
 *  @param u2CompId    its id; the low 8 bits count: video planes 0 (port 0) and 1 to 3 (port 1), OSD planes 0 to 5
 *                     (ports 2 to 7)
 *  @return port 0 to 7; 8: none
 *  @context any thread; takes no lock */
PMX_API UINT32 u4PmxCompId2LocalId(UINT16 u2CompType, UINT16 u2CompId);

/** Record that an upstream component feeds the mixer. It replaces whatever the port held; whether the source is enabled
 *  stays.
 *  @param u2ThisCompType      ignored, a PMX_COMP_TYPE_ value
 *  @param u2ThisCompId        the mixer's component id, 0
 *  @param u2UpstreamCompType  the component's type, a PMX_COMP_TYPE_ value
 *  @param u2UpstreamCompId    its id
 *  @return PMX_PORT_DONE; PMX_NO_SUCH_PORT for a component without a port or a mixer id other than 0, and then nothing
 *          is stored
 *  @context a thread that may sleep; takes MutexPMX: never from inside pu4SetColorMode */
PMX_API UINT32 i4Pmx_Connect(UINT16 u2ThisCompType, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType,
                             UINT16 u2UpstreamCompId);

/** Clear an upstream component's port, whatever it holds; the source is not enabled any more. The master colour space
 *  is not decided here: see PMX_DecideMasterColorSpace.
 *  @param u2ThisCompType      ignored, a PMX_COMP_TYPE_ value
 *  @param u2ThisCompId        the mixer's component id, 0
 *  @param u2UpstreamCompType  the component's type, a PMX_COMP_TYPE_ value
 *  @param u2UpstreamCompId    its id
 *  @return PMX_PORT_DONE; PMX_NO_SUCH_PORT for a component without a port or a mixer id other than 0, and then nothing
 *          is cleared
 *  @context a thread that may sleep; takes MutexPMX: never from inside pu4SetColorMode */
PMX_API UINT32 i4Pmx_Disconnect(UINT16 u2ThisCompType, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType,
                                UINT16 u2UpstreamCompId);

/* Source events. Ports and the master colour space are written without a lock; events that come at once are not put in
 * order here. */

/** A video plane starts to deliver pictures. Decides the master colour space anew. Plane 2 switches full-range
 *  conversion of graphics on, plane 1 switches it off.
 *  @param ucPmxId      mixer id, unchecked; the hardware is asked with it as given
 *  @param ucVdpId      0 main video, 1 second video, 2 still-picture background (always BT.601), 3
 *  @param i4SrcWidth   pixels; above 720 the source is BT.709
 *  @param i4SrcHeight  lines; above 576 the source is BT.709
 *  @param ucLumaKey    luma key; planes 1 to 3 have a say in the master colour space only with one, and while the
 *                      hardware mixes plane 1
 *  @return 1; 0 for a plane without a port or with one that nobody connected, and then nothing has changed
 *  @context a thread that may sleep, outside MutexPMX, which a change of the master colour space takes */
PMX_API UINT32 PMX_VdpEnabled(UCHAR ucPmxId, UCHAR ucVdpId, INT32 i4SrcWidth, INT32 i4SrcHeight, UCHAR ucLumaKey);

/** A video plane stops. The master colour space stays until the next decision. Plane 2 switches full-range conversion
 *  of graphics off.
 *  @param ucPmxId  mixer id, unchecked
 *  @param ucVdpId  video plane 0 to 3
 *  @return 1, connected or not; 0 for a plane without a port
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_VdpDisabled(UCHAR ucPmxId, UCHAR ucVdpId);

/** An OSD plane starts. The colour space of YCbCr graphics becomes the master's at once. RGB graphics change neither it
 *  nor the colour mode and colour space of their port: one that was YCbCr goes on counting as YCbCr.
 *  @param ucPmxId        mixer id, unchecked
 *  @param ucOsdId        OSD plane 0 to 5
 *  @param i4SrcWidth     pixels; above 720 the source is BT.709
 *  @param i4SrcHeight    lines; above 576 the source is BT.709
 *  @param eSrcColorMode  colour mode of its pixels; any but DRV_GFX_COLOR_MODE_YCBCR counts as RGB
 *  @return 1, connected or not; 0 for a plane without a port
 *  @context a thread that may sleep, outside MutexPMX, which a change of the master colour space takes */
PMX_API UINT32 PMX_OsdEnabled(UCHAR ucPmxId, UCHAR ucOsdId, INT32 i4SrcWidth, INT32 i4SrcHeight,
                              DRV_GFX_COLOR_MODE_T eSrcColorMode);

/** An OSD plane stops. Decides the master colour space anew.
 *  @param ucPmxId  mixer id, unchecked
 *  @param ucOsdId  OSD plane 0 to 5
 *  @return 1, connected or not; 0 for a plane without a port
 *  @context a thread that may sleep, outside MutexPMX, which a change of the master colour space takes */
PMX_API UINT32 PMX_OsdDisabled(UCHAR ucPmxId, UCHAR ucOsdId);

/** Choose the master colour space anew from what is enabled, and announce a change: YCbCr graphics before the second
 *  video before the main video, among graphics the highest port; with nothing enabled it stays. The second video counts
 *  only with a luma key and while the hardware mixes it; RGB graphics never do; whether a port is connected does not
 *  matter.
 *  @param ucPmxId  mixer id, unchecked; the hardware is asked with it as given
 *  @return 1
 *  @context a thread that may sleep, outside MutexPMX, which a change takes */
PMX_API UINT32 PMX_DecideMasterColorSpace(UCHAR ucPmxId);

/** Tell every connected video plane the master colour space through its IVdp table. A plane whose table cannot be
 *  fetched is logged, reported by Assert and passed over.
 *  @param ucPmxId  mixer id, unchecked
 *  @context a thread that may sleep; holds MutexPMX across the calls */
PMX_API void PMX_InformVdpColorSpace(UCHAR ucPmxId);

/* Source events through IPMX. They are inert: only the direct calls count. */

/** IPMX: graphics plane enabled; does nothing.
 *  @param[in] pvTag           [tag] ignored
 *  @param     i4SrcWidth      ignored
 *  @param     i4SrcHeight     ignored
 *  @param     eSrcColorSpace  ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxOsdEnabled(void* pvTag, INT32 i4SrcWidth, INT32 i4SrcHeight, DRV_GFX_COLOR_MODE_T eSrcColorSpace);

/** IPMX: graphics plane disabled; does nothing.
 *  @param[in] pvTag  [tag] ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxOsdDisabled(void* pvTag);

/** IPMX: video plane enabled; does nothing.
 *  @param[in] pvTag        [tag] ignored
 *  @param     i4SrcWidth   ignored
 *  @param     i4SrcHeight  ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxVdpEnabled(void* pvTag, INT32 i4SrcWidth, INT32 i4SrcHeight);

/** IPMX: video plane disabled; does nothing.
 *  @param[in] pvTag  [tag] ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxVdpDisabled(void* pvTag);

/* Picture adjustments */

/** Set brightness, of the analogue outputs or of HDMI. The record keeps the analogue one alone. The mixer's own
 *  brightness follows in either case.
 *  @param ucPmxId       mixer id, 0
 *  @param ucBrightness  128 = neutral
 *  @param bSetTVE       0 HDMI, anything else the analogue outputs
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 21 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetBrightness(UCHAR ucPmxId, UCHAR ucBrightness, UCHAR bSetTVE);

/** Read brightness of the analogue outputs.
 *  @param      ucPmxId        mixer id, 0
 *  @param[out] pucBrightness  receives it
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 21 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetBrightness(UCHAR ucPmxId, UCHAR* pucBrightness);

/** Set brightness of the analogue outputs of mixer 0.
 *  @param ucBrightness  as for PMX_SetBrightness
 *  @context any thread that may sleep; takes no lock */
PMX_API void d_PMX_SetBrightness(UCHAR ucBrightness);

/** Read brightness of the analogue outputs of mixer 0.
 *  @param[out] pucBrightness  receives it, unless PMX_GetBrightness fails
 *  @context any thread; takes no lock */
PMX_API void d_PMX_GetBrightness(UCHAR* pucBrightness);

/** Set contrast, of the analogue outputs or of HDMI. The record keeps the analogue one alone. The mixer's own contrast
 *  follows in either case.
 *  @param ucPmxId     mixer id, 0
 *  @param ucContrast  128 = neutral
 *  @param bSetTVE     0 HDMI, anything else the analogue outputs
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 22 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetContrast(UCHAR ucPmxId, UCHAR ucContrast, UCHAR bSetTVE);

/** Read contrast of the analogue outputs.
 *  @param      ucPmxId      mixer id, 0
 *  @param[out] pucContrast  receives it
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 22 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetContrast(UCHAR ucPmxId, UCHAR* pucContrast);

/** Set contrast of the analogue outputs of mixer 0.
 *  @param ucContrast  as for PMX_SetContrast
 *  @context any thread that may sleep; takes no lock */
PMX_API void d_PMX_SetContrast(UCHAR ucContrast);

/** Read contrast of the analogue outputs of mixer 0.
 *  @param[out] pucContrast  receives it, unless PMX_GetContrast fails
 *  @context any thread; takes no lock */
PMX_API void d_PMX_GetContrast(UCHAR* pucContrast);

/** Set hue, of the analogue outputs or of HDMI. The record keeps the analogue one alone.
 *  @param ucPmxId  mixer id, 0
 *  @param ucHue    128 = neutral
 *  @param bSetTVE  0 HDMI, anything else the analogue outputs
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 23 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetHue(UCHAR ucPmxId, UCHAR ucHue, UCHAR bSetTVE);

/** Read hue of the analogue outputs.
 *  @param      ucPmxId  mixer id, 0
 *  @param[out] pucHue   receives it
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 23 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetHue(UCHAR ucPmxId, UCHAR* pucHue);

/** Set hue of the analogue outputs of mixer 0.
 *  @param ucHue  as for PMX_SetHue
 *  @context any thread that may sleep; takes no lock */
PMX_API void d_PMX_SetHue(UCHAR ucHue);

/** Read hue of the analogue outputs of mixer 0.
 *  @param[out] pucHue  receives it, unless PMX_GetHue fails
 *  @context any thread; takes no lock */
PMX_API void d_PMX_GetHue(UCHAR* pucHue);

/** Set saturation, of the analogue outputs or of HDMI. The record keeps the analogue one alone.
 *  @param ucPmxId       mixer id, 0
 *  @param ucSaturation  128 = neutral
 *  @param bSetTVE       0 HDMI, anything else the analogue outputs
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 24 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetSaturation(UCHAR ucPmxId, UCHAR ucSaturation, UCHAR bSetTVE);

/** Read saturation of the analogue outputs.
 *  @param      ucPmxId        mixer id, 0
 *  @param[out] pucSaturation  receives it
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 24 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetSaturation(UCHAR ucPmxId, UCHAR* pucSaturation);

/** Set saturation of the analogue outputs of mixer 0.
 *  @param ucSaturation  as for PMX_SetSaturation
 *  @context any thread that may sleep; takes no lock */
PMX_API void d_PMX_SetSaturation(UCHAR ucSaturation);

/** Read saturation of the analogue outputs of mixer 0.
 *  @param[out] pucSaturation  receives it, unless PMX_GetSaturation fails
 *  @context any thread; takes no lock */
PMX_API void d_PMX_GetSaturation(UCHAR* pucSaturation);

/** Set sharpness, of the analogue outputs or of HDMI. The record keeps the analogue one alone.
 *  @param ucPmxId      mixer id, 0
 *  @param ucSharpness  the encoder's unit; 0 after a reset
 *  @param bSetTVE      0 HDMI, anything else the analogue outputs
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 27 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetSharpness(UCHAR ucPmxId, UCHAR ucSharpness, UCHAR bSetTVE);

/** Read sharpness of the analogue outputs.
 *  @param      ucPmxId       mixer id, 0
 *  @param[out] pucSharpness  receives it
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 27 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetSharpness(UCHAR ucPmxId, UCHAR* pucSharpness);

/** Set sharpness of the analogue outputs of mixer 0.
 *  @param ucSharpness  as for PMX_SetSharpness
 *  @context any thread that may sleep; takes no lock */
PMX_API void d_PMX_SetSharpness(UCHAR ucSharpness);

/** Read sharpness of the analogue outputs of mixer 0.
 *  @param[out] pucSharpness  receives it, unless PMX_GetSharpness fails
 *  @context any thread; takes no lock */
PMX_API void d_PMX_GetSharpness(UCHAR* pucSharpness);

/** Select a gamma curve.
 *  @param ucPmxId  mixer id, 0
 *  @param ucGamma  0 off, 1 to 4 curve; any other is stored as given and switches gamma off
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 20 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetGamma(UCHAR ucPmxId, UCHAR ucGamma);

/** Read what PMX_SetGamma was last given.
 *  @param      ucPmxId   mixer id, 0
 *  @param[out] pucGamma  receives it
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 20 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetGamma(UCHAR ucPmxId, UCHAR* pucGamma);

/** Read the number of gamma curves.
 *  @param      ucPmxId     mixer id, 0
 *  @param[out] pucGammaNs  receives 4
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 20 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetGammaNs(UCHAR ucPmxId, UCHAR* pucGammaNs);

/** Set the black level of the analogue outputs.
 *  @param ucPmxId   mixer id, 0
 *  @param ucCAVEn   component's switch
 *  @param ucCVBSEn  composite's switch
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 30 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetBlackLv(UCHAR ucPmxId, UCHAR ucCAVEn, UCHAR ucCVBSEn);

/** Read the black level of the analogue outputs.
 *  @param      ucPmxId    mixer id, 0
 *  @param[out] pucCAVEn   receives component's switch
 *  @param[out] pucCVBSEn  receives composite's switch
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 30 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetBlackLv(UCHAR ucPmxId, UCHAR* pucCAVEn, UCHAR* pucCVBSEn);

/** Select where the digital port takes its picture.
 *  @param fgBeforeMixer  0 behind the mixer, anything else before it
 *  @return 1
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDGOSource(BOOL fgBeforeMixer);

/** Switch composite's set-up.
 *  @param fgEnable  on
 *  @return 1
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetCVBSSetup(BOOL fgEnable);

/** Switch composite's PAL-60.
 *  @param fgEnable  on
 *  @return 1
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetCVBSPal60(BOOL fgEnable);

/** Tell the TV encoders the kind of medium that plays; not stored.
 *  @param ucPmxId      mixer id, 0
 *  @param ucMediaType  the middleware's code
 *  @return 1; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetMediaType(UCHAR ucPmxId, UCHAR ucMediaType);

/** Ask for 2D smoothing; other drivers read _fg2DCap.
 *  @param uc2D  0 off, anything else on
 *  @context any thread; takes no lock */
PMX_API void d_PMX_Set2DSmooth(UCHAR uc2D);

/* Aspect ratio */

/** Set the normal aspect ratio and signal it on HDMI.
 *  @param ucPmxId        mixer id, 0
 *  @param u4AspectRatio  an ASPECT_RATIO_T value
 *  @return 1; 0 for a mixer id other than 0; 0 also when the HDMI/AV driver refuses it, and then it is stored all the
 *          same, and the video planes are not told
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetAspectRatio(UCHAR ucPmxId, UINT32 u4AspectRatio);

/** Set the normal aspect ratio now, which drops one that waits, or let it wait for PMX_SetAspectRatioNext.
 *  @param ucPmxId        mixer id, 0
 *  @param u4AspectRatio  an ASPECT_RATIO_T value
 *  @param fgApplyOnNext  0 now, anything else: it waits
 *  @return 1; 0 for a mixer id other than 0; 0 also when the HDMI/AV driver refuses it, and then it is stored all the
 *          same, and the video planes are not told
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetAspectRatioEx(UCHAR ucPmxId, UINT32 u4AspectRatio, BOOL fgApplyOnNext);

/** Apply the aspect ratio that waits; callers do it at a mode change.
 *  @param ucPmxId  mixer id; HDMI is told for 0 alone
 *  @return the normal aspect ratio afterwards (an ASPECT_RATIO_T value, not a success), also when none waited; 0 when
 *          the HDMI/AV driver refuses it, and then it is stored all the same, waits no more, and the video planes are
 *          not told
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetAspectRatioNext(UCHAR ucPmxId);

/** Enter or leave the digest view with its aspect ratio. Leaving sets the analogue widescreen signalling.
 *  @param ucPmxId         mixer id, 0
 *  @param u4AspectRatio   an ASPECT_RATIO_T value; stored in either case
 *  @param fgDigestEnable  0 leave, anything else enter
 *  @return 1; 0 for a mixer id other than 0
 *  @context a thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDigestAspectRatioEx(UCHAR ucPmxId, UINT32 u4AspectRatio, BOOL fgDigestEnable);

/** Read the aspect ratio in force: the digest view's while it is shown, else the normal one.
 *  @param      ucPmxId         mixer id, 0
 *  @param[out] pu4AspectRatio  receives an ASPECT_RATIO_T value
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio);

/** IPMX: PMX_GetAspectRatio.
 *  @param[in]  pvTag           [tag] the table's tag
 *  @param[out] pu4AspectRatio  receives an ASPECT_RATIO_T value
 *  @return 1; 0 for a tag whose low 8 bits are not 0, or a null pointer
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetAspectRatio(void* pvTag, UINT32* pu4AspectRatio);

/** Ask whether the digest view is shown.
 *  @param ucPmxId  mixer id, 0
 *  @return TRUE or FALSE; FALSE for a mixer id other than 0
 *  @context any thread; takes no lock */
PMX_API BOOL PMX_IsUnderDigestMode(UCHAR ucPmxId);

/** Read the normal aspect ratio, digest view or not.
 *  @param      ucPmxId         mixer id, 0
 *  @param[out] pu4AspectRatio  receives an ASPECT_RATIO_T value
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetNormalAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio);

/** Read the digest view's aspect ratio, shown or not.
 *  @param      ucPmxId         mixer id, 0
 *  @param[out] pu4AspectRatio  receives an ASPECT_RATIO_T value
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetDigestAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio);

/** Read the aspect ratio that the middleware asked for last: the one that waits, if any, else the normal one.
 *  @param      ucPmxId         mixer id, 0
 *  @param[out] pu4AspectRatio  receives an ASPECT_RATIO_T value
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetAspectRatioMW(UCHAR ucPmxId, UINT32* pu4AspectRatio);

/* Digital output: while the mixer is off, enable and parameters are only stored, and PMX_SetEnable applies them */

/** Switch the parallel digital port.
 *  @param ucPmxId   mixer id, 0
 *  @param ucEnable  0 off, anything else on
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 25 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDigitalOutEnable(UCHAR ucPmxId, UCHAR ucEnable);

/** Read the parallel digital port's switch.
 *  @param      ucPmxId    mixer id, 0
 *  @param[out] pucEnable  receives the value last given
 *  @return 1; 0 for a mixer id other than 0, a null pointer or when capability bit 25 is clear
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetDigitalOutEnable(UCHAR ucPmxId, UCHAR* pucEnable);

/** Set the parallel digital port's bus.
 *  @param ucPmxId            mixer id, 0
 *  @param ucDigitalBit       bus width in bits
 *  @param ucProprietaryMode  vendor mode code
 *  @return 1; 0 for a mixer id other than 0 or when capability bit 25 is clear
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDigitalOutPara(UCHAR ucPmxId, UCHAR ucDigitalBit, UCHAR ucProprietaryMode);

/** Set the parallel digital port's clock phase, at once.
 *  @param ucPmxId  mixer id, 0
 *  @param u4Phase  phase in the hardware's unit; the record keeps its low 8 bits, which PMX_SetEnable applies again
 *  @return 1; 0 for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDigitalOutPhase(UCHAR ucPmxId, UINT32 u4Phase);

/** Set the parallel digital port's pad drive strength, at once; not stored.
 *  @param u4Drving  strength in the hardware's unit
 *  @return 1
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDigitalOutDrv(UINT32 u4Drving);

/** Choose between RGB and YCbCr for the digital picture, on the port and on HDMI, at once.
 *  @param ucPmxId  mixer id, 0
 *  @param ucRgb    a PLA_MXR_DIGITAL_OUTPUT_FMT_T value
 *  @return 1; 0 for a mixer id other than 0; 0 also for a value above 4, and then it has been stored and programmed,
 *          and HDMI is not told
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetDigitalOutRgb(UCHAR ucPmxId, UCHAR ucRgb);

/** Read the digital picture's colour format.
 *  @param      ucPmxId  mixer id, 0
 *  @param[out] pucRgb   receives the PLA_MXR_DIGITAL_OUTPUT_FMT_T value last given
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetDigitalOutRgb(UCHAR ucPmxId, UCHAR* pucRgb);

/* External chip, closed caption */

/** Set one of the external chip's picture controls; not stored.
 *  @param eSetType  a PLA_MXR_EXTERNAL_CHIP_SETTING_E value
 *  @param i4Value   its value; the chip takes the low 8 bits
 *  @return 1, whatever the driver answers; 0 for an unknown setting
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetExternalChipSetting(PLA_MXR_EXTERNAL_CHIP_SETTING_E eSetType, INT32 i4Value);

/** Switch closed captions.
 *  @param ucPmxId              mixer id, 0; for any other nothing is done
 *  @param eClosedCaptionOnOff  PLA_MXR_CLOSED_CAPTION_ON; any other value switches them off
 *  @return 1, also for a mixer id other than 0
 *  @context any thread that may sleep; takes no lock */
PMX_API UINT32 PMX_SetClosedCaptionOnOff(UCHAR ucPmxId, PLA_MXR_CLOSED_CAPTION_ON_OFF_T eClosedCaptionOnOff);

#ifdef __cplusplus
}
#endif

#endif
