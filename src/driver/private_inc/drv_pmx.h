/** @file
 *  The mixer layer: every function that it offers, with its contract. This is the header that a caller includes.
 *
 *  One mixer exists, id 0. Unless its contract says otherwise a function returns 1 on success and 0 on failure, and a
 *  function that failed has changed nothing. An id that goes unchecked is taken for mixer 0.
 *  Pointers are tested for null where the contract says so, and only there.
 *
 *  Functions i4Pmx… behind the IPMX table take a tag whose low 8 bits are the mixer id. */
#ifndef DRV_PMX_H
#define DRV_PMX_H

#include "drv_if_pmx.h"
#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** Success of PMX_SetTvType and of the mode settings. */
#define PMX_SET_OK 1

/** TV types: systems with 60 and with 50 fields a second. */
#define PMX_TV_TYPE_NTSC 0
#define PMX_TV_TYPE_PAL 3

/* Start-up, reset, shut-down, power */

/** Start the layer: create its mutex and timer, reset record and hardware to the defaults, register the IPMX table and
 *  the power-management operations. Only logs when it has been started already. A failing operating-system call is
 *  reported by Assert and start-up goes on.
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API void PMX_Init(void);

/** Reload the default record, take the boot resolution and program the hardware for it. Until the first per-output mode
 *  setting (_fgBootUp) scaler and TV encoder keep what the boot loader set. Clears the handshake, its timer's handle
 *  included: after a reset of a started layer nobody knows the timer any more, and starting it fails with an Assert.
 *  @param ucPmxId  mixer id, 0; for any other nothing is done
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API void PMX_Reset(UCHAR ucPmxId);

/** Shut the layer down: withdraw power management and the IPMX table, delete timer and mutex. A timer or mutex that
 *  cannot be deleted is reported by Assert, a table that cannot be withdrawn in the log. Only logs unless the layer has
 *  been started.
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API void PMX_Uninit(void);

/** Shut the layer down for a caller that wants a result. Unlike PMX_Uninit it leaves power management registered,
 *  deletes the mutex only if there is one, and reports its failed deletion by the result instead of Assert; MutexPMX
 *  then keeps its handle. A timer that cannot be deleted is reported by Assert. Whatever fails, the layer counts as not
 *  started afterwards.
 *  @param u4Case  why; only logged
 *  @return 0, also when the layer had not been started; -1 when the mutex could not be deleted
 *  @context the framework's thread, with no other mixer call running; sleeps */
PMX_API INT32 i4PMX_Uninit(UINT32 u4Case);

/** Stop vertical-sync handling and mark the layer as not started. Mutex, timer, registration and power management stay
 *  as they are; a later shut-down does nothing, a later PMX_Init starts anew.
 *  @context the framework's thread, with no other mixer call running */
PMX_API void PMX_Stop(void);

/** Gate the mixer's clocks; the suspend member of pmx_pm_ops. The record is left alone.
 *  @param param  ignored
 *  @return 0
 *  @context the kernel's power management */
PMX_API int i4PMX_Suspend(void* param);

/** Run the mixer's clocks again; the resume member of pmx_pm_ops. The record is left alone.
 *  @param param  ignored
 *  @return 0
 *  @context the kernel's power management */
PMX_API int i4PMX_Resume(void* param);

/** Register the IPMX table at the interface manager.
 *  @param u2CompType  component type, 66 for the mixer
 *  @param u2CompId    component id, 0; it is also the tag that the table's users hand back
 *  @return the interface manager's result, negative on a failure
 *  @context a thread that may sleep */
PMX_API INT32 i4PmxRegisterIM(UINT16 u2CompType, UINT16 u2CompId);

/** Withdraw the IPMX table from the interface manager.
 *  @param u2CompType  component type, 66 for the mixer
 *  @param u2CompId    component id, 0
 *  @return the interface manager's result, negative on a failure
 *  @context a thread that may sleep */
PMX_API INT32 i4PmxUnregisterIM(UINT16 u2CompType, UINT16 u2CompId);

/* Master enable, capability, second video plane */

/** Read the capability word.
 *  @param ucPmxId  mixer id, 0
 *  @param pu4Cap   receives it: bits 0 to 16 admit groups of resolution modes, 20 to 25, 27 and 30 features
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
 *  @param ucPmxId    mixer id, 0
 *  @param pucEnable  receives the value last given to PMX_SetEnable, 0 after a reset
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetEnable(UCHAR ucPmxId, UCHAR* pucEnable);

/** Put the video plane that sits in the second mixer plane into the mix. The first mixer plane is never switched here.
 *  @param ucPmxId  mixer id, handed on unchecked
 * @param ucVdpId  the plane that sits there: 1, or instead 0 while the hardware swaps the two; for any other nothing is
 * done
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_EnableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId);

/** Take the video plane that sits in the second mixer plane out of the mix. The first mixer plane is never switched
 *  here.
 *  @param ucPmxId  mixer id, handed on unchecked
 * @param ucVdpId  the plane that sits there: 1, or instead 0 while the hardware swaps the two; for any other nothing is
 * done
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_DisableVideoPlane(UCHAR ucPmxId, UCHAR ucVdpId);

/** IPMX: PMX_EnableVideoPlane.
 *  @param pvTag    the table's tag
 *  @param ucVdpId  video plane
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxEnableVideoPlane(void* pvTag, UCHAR ucVdpId);

/** IPMX: PMX_DisableVideoPlane.
 *  @param pvTag    the table's tag
 *  @param ucVdpId  video plane
 *  @return 1
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxDisableVideoPlane(void* pvTag, UCHAR ucVdpId);

/* Boot resolution, video PLL, TV type */

/** Read the boot resolution that the boot loader left in the partition "fast_init_param".
 * @return the low byte of the partition's first word, a PMX_RESOLUTION_MODE_T value that nobody has validated; RES_480I
 * when the partition is missing or cannot be read
 *  @context a thread that may sleep */
PMX_API UINT8 PMX_GetHDMIDefaultRes(void);

/** Set the video PLL's synthesiser word that a mode needs.
 *  @param bResIndex  a PMX_RESOLUTION_MODE_T value; any other takes the word of the 50 Hz and 24 Hz modes
 *  @context a thread that may sleep: waits twice for 1 ms */
PMX_API void vSetPLLGP_HDMIDDS(BYTE bResIndex);

/** Store and program the TV type.
 *  @param ucPmxId   mixer id, 0
 *  @param ucTvType  PMX_TV_TYPE_NTSC or PMX_TV_TYPE_PAL; any other is stored and forwarded as given
 *  @return PMX_SET_OK; 0 for a mixer id other than 0
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType);

/** Read the TV type.
 *  @param ucPmxId    mixer id, 0
 *  @param pucTvType  receives it
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetTvType(UCHAR ucPmxId, UCHAR* pucTvType);

/* Diagnostics */

/** The module's own formatted print, admitted by bit `level` of PMX_debug_level. The text is cut to 511 characters and
 *  goes to the console as a format: a percent sign that the values brought in is interpreted once more.
 *  @param level          0 to 31; any other prints nothing
 *  @param format_string  printf format
 *  @context any thread; takes no lock, needs 512 bytes of stack */
PMX_API void PMX_Printf(INT32 level, const char* format_string, ...) DRV_PRINTF_FORMAT(2, 3);

/** Print the whole record of mixer 0 to the console at level 0. Takes no lock: while a mode is being set, some lines
 *  may show what was and others what will be.
 *  @context any thread */
PMX_API void PMX_QueryStatus(void);

/* Mode */

/** Read the mixer's resolution mode.
 *  @param ucPmxId  mixer id, 0
 *  @param pucMode  receives a PMX_RESOLUTION_MODE_T value
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetMode(UCHAR ucPmxId, UCHAR* pucMode);

/** IPMX: PMX_GetMode.
 *  @param pvTag    the table's tag
 *  @param pucMode  receives a PMX_RESOLUTION_MODE_T value
 *  @return 1; 0 for a tag whose low 8 bits are not 0, or a null pointer
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetMode(void* pvTag, UCHAR* pucMode);

/* Geometry */

/** Read the size of the mixer's picture in its resolution mode. The 1440 and 2880 modes count 720 pixels;
 *  RES_2D_576I50HZ, the 4K modes and all other numbers count 1920 x 1080.
 *  @param ucPmxId    mixer id, 0
 *  @param pu4Width   receives the width in pixels
 *  @param pu4Height  receives the height in lines of a frame
 *  @return 1; 0 for a mixer id other than 0 or if either pointer is null, and then neither is written
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetOutSize(UCHAR ucPmxId, UINT32* pu4Width, UINT32* pu4Height);

/** IPMX: PMX_GetOutSize.
 *  @param pvTag      the table's tag
 *  @param pu4Width   receives the width in pixels
 *  @param pu4Height  receives the height in lines of a frame
 *  @return 1; 0 for a tag whose low 8 bits are not 0, or if either pointer is null, and then neither is written
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetOutSize(void* pvTag, UINT32* pu4Width, UINT32* pu4Height);

/* Plane composition */

/** Ask in which mixer plane a video plane sits; the hardware's swap of planes 1 and 2 decides.
 *  @param ucPmxId    mixer id, handed on unchecked
 *  @param ucVdpHwId  video plane 0 or 1; any other is logged, reported by Assert and answered with DRV_PMX_PLANE_1
 *  @return a DRV_PMX_PLANE_T value
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_VdpGetPlanePosition(UCHAR ucPmxId, UCHAR ucVdpHwId);

/** IPMX: PMX_VdpGetPlanePosition.
 *  @param pvTag      the table's tag
 *  @param ucVdpHwId  video plane 0 or 1
 *  @return a DRV_PMX_PLANE_T value
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetPlanePosition(void* pvTag, UCHAR ucVdpHwId);

/* Source events through IPMX. They are inert: only the direct calls count. */

/** IPMX: graphics plane enabled; does nothing.
 *  @param pvTag           ignored
 *  @param i4SrcWidth      ignored
 *  @param i4SrcHeight     ignored
 *  @param eSrcColorSpace  ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxOsdEnabled(void* pvTag, INT32 i4SrcWidth, INT32 i4SrcHeight, DRV_GFX_COLOR_MODE_T eSrcColorSpace);

/** IPMX: graphics plane disabled; does nothing.
 *  @param pvTag  ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxOsdDisabled(void* pvTag);

/** IPMX: video plane enabled; does nothing.
 *  @param pvTag        ignored
 *  @param i4SrcWidth   ignored
 *  @param i4SrcHeight  ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxVdpEnabled(void* pvTag, INT32 i4SrcWidth, INT32 i4SrcHeight);

/** IPMX: video plane disabled; does nothing.
 *  @param pvTag  ignored
 *  @return 1
 *  @context any */
PMX_API INT32 i4PmxVdpDisabled(void* pvTag);

/* Aspect ratio */

/** Read the aspect ratio in force: the digest view's while it is shown, else the normal one.
 *  @param ucPmxId         mixer id, 0
 *  @param pu4AspectRatio  receives an ASP_ code
 *  @return 1; 0 for a mixer id other than 0 or a null pointer
 *  @context any thread; takes no lock */
PMX_API UINT32 PMX_GetAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio);

/** IPMX: PMX_GetAspectRatio.
 *  @param pvTag           the table's tag
 *  @param pu4AspectRatio  receives an ASP_ code
 *  @return 1; 0 for a tag whose low 8 bits are not 0, or a null pointer
 *  @context any thread; takes no lock */
PMX_API INT32 i4PmxGetAspectRatio(void* pvTag, UINT32* pu4AspectRatio);

#ifdef __cplusplus
}
#endif

#endif
