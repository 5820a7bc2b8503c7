/* Every function that a stack provides, with its contract and an empty body: what a port starts from.
 * Written from the headers by port_skeleton.py; copy it and fill the bodies, group by group, console first. As it
 * stands it links with pmx_if.o, answers 0 and does nothing, but for the list of timers that every port keeps. */
#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_osd.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "u_os.h"

/* u_os.h */

/** Create a semaphore.
 *  The stack guarantees that a failed creation leaves *phSema as it was.
 *  @param[out] phSema       receives the handle, never 0 on success
 *  @param      eType        binary, counting, or mutex (owned by the thread that locked it)
 *  @param      u4InitValue  1: free, 0: taken; a count for a counting semaphore
 *  @return OSR_OK or a failure
 *  @context a thread that may sleep */
INT32 x_sema_create(HANDLE_T* phSema, X_SEMA_TYPE_T eType, UINT32 u4InitValue)
{
    (void)phSema;
    (void)eType;
    (void)u4InitValue;
    return 0;
}

/** Take a semaphore. The mixer waits for ever and never nests its mutex.
 *  @param hSema    handle from x_sema_create
 *  @param eOption  wait or not
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context a thread that may sleep */
INT32 x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption)
{
    (void)hSema;
    (void)eOption;
    return 0;
}

/** Give a semaphore back.
 *  The stack guarantees that the semaphore is free again even when a failure is reported to its holder.
 *  @param hSema  handle from x_sema_create
 *  @return OSR_OK or a failure
 *  @context the thread that holds it */
INT32 x_sema_unlock(HANDLE_T hSema)
{
    (void)hSema;
    return 0;
}

/** Delete a semaphore. A failed deletion leaves it usable.
 *  @param hSema  handle from x_sema_create
 *  @return OSR_OK or a failure
 *  @context a thread that may sleep */
INT32 x_sema_delete(HANDLE_T hSema)
{
    (void)hSema;
    return 0;
}

/* The timers that exist; the first has handle 1. */
#define PORT_TIMERS 8
static BOOL afgTimerExists[PORT_TIMERS];

static BOOL fgTimerExists(HANDLE_T hTimer)
{
    return hTimer >= 1 && hTimer <= PORT_TIMERS && afgTimerExists[hTimer - 1];
}

/** Create a timer, stopped.
 *  The stack guarantees that a failed creation leaves *phTimer as it was. It keeps a list of the timers that exist: the
 *  mixer can lose the handle of its own, running or not (PMX_Reset, PMX_Init behind PMX_Stop), and when the stack is
 *  unloaded it deletes, behind PMX_Uninit, what is left.
 *  @param[out] phTimer  receives the handle, never 0 on success
 *  @return OSR_OK or a failure
 *  @context a thread that may sleep */
INT32 x_timer_create(HANDLE_T* phTimer)
{
    HANDLE_T hTimer;

    for (hTimer = 1; hTimer <= PORT_TIMERS; hTimer++)
    {
        if (!fgTimerExists(hTimer))
        {
            /* here the system's timer is made */
            afgTimerExists[hTimer - 1] = TRUE;
            *phTimer = hTimer;
            return OSR_OK;
        }
    }
    return -1;
}

/** Start a timer, from its full interval when it is running.
 *  @param     hTimer      handle from x_timer_create
 *  @param     u4DelayMs   interval in milliseconds
 *  @param     eFlag       once or repeatedly
 *  @param[in] pfCallback  [symbol] expiry function, called in the timer's context
 *  @param[in] pvArg       [tag] handed to the expiry function
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context any thread */
INT32 x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback, void* pvArg)
{
    (void)u4DelayMs;
    (void)eFlag;
    (void)pfCallback;
    (void)pvArg;
    return fgTimerExists(hTimer) ? OSR_OK : -1;
}

/** Stop a timer; succeeds also when it is not running.
 *  An expiry that has already begun is not waited for.
 *  @param hTimer  handle from x_timer_create
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context any thread */
INT32 x_timer_stop(HANDLE_T hTimer)
{
    return fgTimerExists(hTimer) ? OSR_OK : -1;
}

/** Stop and delete a timer. Lets an expiry that is under way come to its end: when it returns, the expiry function is
 *  not running and will not run again, and what it reaches may go. The mixer holds no lock meanwhile.
 *  @param hTimer  handle from x_timer_create
 *  @return OSR_OK or a failure (a bad handle, for instance 0)
 *  @context a thread that may sleep */
INT32 x_timer_delete(HANDLE_T hTimer)
{
    if (!fgTimerExists(hTimer))
        return -1;
    /* here the system's timer is stopped, and an expiry that runs may end (in Linux timer_delete_sync) */
    afgTimerExists[hTimer - 1] = FALSE;
    return OSR_OK;
}

/** Sleep.
 *  @param u4DelayMs  at least so many milliseconds
 *  @context a thread that may sleep */
void x_thread_delay(UINT32 u4DelayMs)
{
    (void)u4DelayMs;
}

/** Format text; always terminates it.
 *  @param[out] szBuffer  [text of zSize] receives the text
 *  @param      zSize     its size in characters, terminator included
 *  @param[in]  szFormat  [text] printf format
 *  @param      rArgs     its values
 *  @return length that the whole text has, without the terminator; negative on a failure
 *  @context any */
INT32 x_vsnprintf(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, va_list rArgs)
{
    (void)szBuffer;
    (void)zSize;
    (void)szFormat;
    (void)rArgs;
    return 0;
}

/** Levelled console print: prints when the console's level admits i4Level.
 *  A null string argument is printed as (null).
 *  @param     i4Level   0 status report, warnings, handshake; 1 life cycle and display-mode progress; 5 errors; 8
 *                       source and plane events, refusals; 9 whatever else helps to follow the layer, and what the
 *                       interface manager refuses
 *  @param[in] szFormat  [text] printf format
 *  @context any, the timer's included */
void PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...)
{
    (void)i4Level;
    (void)szFormat;
}

/** Unconditional console print. A null string argument is printed as (null).
 *  @param[in] szFormat  [text] printf format
 *  @context any */
void Printf(const CHAR* szFormat, ...)
{
    (void)szFormat;
}

/** Unconditional console print of the utility layer. A null string argument is printed as (null).
 *  @param[in] szFormat  [text] printf format
 *  @context any */
void UTIL_Printf(const CHAR* szFormat, ...)
{
    (void)szFormat;
}

/** Report a broken invariant and return: the caller goes on.
 *  @param[in] szExpression  [text] the invariant, or "0"
 *  @param[in] szFile        [text] source path relative to the project's root
 *  @param     i4Line        line in it
 *  @context any, the timer's included */
void Assert(const CHAR* szExpression, const CHAR* szFile, INT32 i4Line)
{
    (void)szExpression;
    (void)szFile;
    (void)i4Line;
}

/** Find a flash partition.
 *  @param[in] szName  [text] its name
 *  @return its id; negative: no such partition
 *  @context a thread that may sleep */
INT32 get_part_id_by_name(const CHAR* szName)
{
    (void)szName;
    return 0;
}

/** Read from a flash partition.
 *  The stack guarantees that a negative id or a read past the end is answered by a failure; the caller does not look.
 *  @param      i4PartId  id from get_part_id_by_name
 *  @param      u4Offset  first byte
 *  @param[out] pvDest    [u4Count bytes] receives u4Count bytes; left as it was by a failed read
 *  @param      u4Count   number of bytes
 *  @return bytes read, negative on a failure
 *  @context a thread that may sleep */
INT32 i4NFBPartitionRead(INT32 i4PartId, UINT32 u4Offset, void* pvDest, UINT32 u4Count)
{
    (void)i4PartId;
    (void)u4Offset;
    (void)pvDest;
    (void)u4Count;
    return 0;
}

/** Read a register of the chip's I/O space, 32 bits in one access of device memory.
 *  @param u4Address  its address
 *  @return its value
 *  @context any */
UINT32 x_reg_read32(UINT32 u4Address)
{
    (void)u4Address;
    return 0;
}

/** Write a register of the chip's I/O space, 32 bits in one access of device memory, in program order.
 *  @param u4Address  its address
 *  @param u4Value    the new value
 *  @context any */
void x_reg_write32(UINT32 u4Address, UINT32 u4Value)
{
    (void)u4Address;
    (void)u4Value;
}

/** Register power-management operations.
 *  @param[in] prOps  [symbol] the operations; the object stays where it is until it is unregistered
 *  @return 0, negative on a failure
 *  @context a thread that may sleep */
int register_pm_ops(const PM_OPERATIONS_T* prOps)
{
    (void)prOps;
    return 0;
}

/** Withdraw power-management operations.
 *  @param[in] prOps  [symbol] the object that was registered
 *  @return 0, negative on a failure
 *  @context a thread that may sleep */
int unregister_pm_ops(const PM_OPERATIONS_T* prOps)
{
    (void)prOps;
    return 0;
}

/* drv_if.h */

/** Publish an interface.
 *  @param     u2CompType  component type, a PMX_COMP_TYPE_ value
 *  @param     u2CompId    component id
 *  @param     u4IfId      interface id, an IID_ value
 *  @param[in] pvIf        [symbol] the table; stays where it is until it is unregistered
 *  @param[in] pvTag       [tag] handed to every function of the table as its first argument
 *  @return 0 or above; negative on a failure
 *  @context a thread that may sleep */
INT32 i4ImRegisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, const void* pvIf, void* pvTag)
{
    (void)u2CompType;
    (void)u2CompId;
    (void)u4IfId;
    (void)pvIf;
    (void)pvTag;
    return 0;
}

/** Withdraw an interface.
 *  @param u2CompType  component type, a PMX_COMP_TYPE_ value
 *  @param u2CompId    component id
 *  @param u4IfId      interface id, an IID_ value
 *  @return 0 or above; negative on a failure, for instance when it is not registered
 *  @context a thread that may sleep */
INT32 i4ImUnregisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId)
{
    (void)u2CompType;
    (void)u2CompId;
    (void)u4IfId;
    return 0;
}

/** Fetch an interface and hold it until it is released.
 *  The stack guarantees that a successful query yields a complete table, no function of it null; a failed one
 *  yields nothing that may be called.
 *  @param      u2CompType  component type, a PMX_COMP_TYPE_ value
 *  @param      u2CompId    component id
 *  @param      u4IfId      interface id, an IID_ value
 *  @param[out] ppvIf       [symbol] receives the table
 *  @param[out] ppvTag      [tag] receives its tag
 *  @return 0 or above; negative on a failure
 *  @context a thread that may sleep; the mixer holds MutexPMX */
INT32 i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag)
{
    (void)u2CompType;
    (void)u2CompId;
    (void)u4IfId;
    (void)ppvIf;
    (void)ppvTag;
    return 0;
}

/** Give a fetched interface back, once for each successful query.
 *  @param     u2CompType  component type, a PMX_COMP_TYPE_ value
 *  @param     u2CompId    component id
 *  @param     u4IfId      interface id, an IID_ value
 *  @param[in] pvTag       [tag] the tag that the query yielded
 *  @return 0 or above; negative on a failure
 *  @context a thread that may sleep; the mixer holds MutexPMX */
INT32 i4ImReleaseInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void* pvTag)
{
    (void)u2CompType;
    (void)u2CompId;
    (void)u4IfId;
    (void)pvTag;
    return 0;
}

/* pmx_hal.h */

/** Program the mixer for a resolution mode.
 *  @param ucPmxId  mixer id
 *  @param ucMode   a PMX_RESOLUTION_MODE_T value */
void PMX_HalSetMode(UCHAR ucPmxId, UCHAR ucMode)
{
    (void)ucPmxId;
    (void)ucMode;
}

/** Program the scaler for a resolution mode.
 *  @param ucMode  a PMX_RESOLUTION_MODE_T value */
void PMX_HalSetScalerMode(UCHAR ucMode)
{
    (void)ucMode;
}

/** Restart the mixer with its current set-up.
 *  @param ucPmxId  mixer id */
void PMX_HalReset(UCHAR ucPmxId)
{
    (void)ucPmxId;
}

/** Restart the scaler with its current set-up.
 *  @param ucPmxId  mixer id */
void PMX_HalScalerReset(UCHAR ucPmxId)
{
    (void)ucPmxId;
}

/** Select the TV type.
 *  @param ucPmxId   mixer id
 *  @param ucTvType  a PMX_TV_TYPE_ value: 0 60 Hz systems, 3 50 Hz systems; any other may come and must do no harm */
void PMX_HalSetTvType(UCHAR ucPmxId, UCHAR ucTvType)
{
    (void)ucPmxId;
    (void)ucTvType;
}

/** Switch a clock of the mixer. Power management calls it too, on suspend and resume.
 *  @param u4ClockId  0 or 2
 *  @param u4On       1 on, 0 off */
void PMX_HalClockSet(UINT32 u4ClockId, UINT32 u4On)
{
    (void)u4ClockId;
    (void)u4On;
}

/** Set the background colour.
 *  @param ucPmxId    mixer id
 *  @param u4BgColor  0x00YYUUVV */
void PMX_HalSetBg(UCHAR ucPmxId, UINT32 u4BgColor)
{
    (void)ucPmxId;
    (void)u4BgColor;
}

/** Program the stacking order.
 *  @param     ucPmxId        mixer id
 *  @param     u4Number       3 at reset, 8 for an order that was asked for
 *  @param[in] pu4PlaneOrder  [8] eight plane ids, position 0 first; a plane may be named twice, and any 32-bit word may
 *                            come and must do no harm */
void PMX_HalPlaneOrder(UCHAR ucPmxId, UINT32 u4Number, const UINT32* pu4PlaneOrder)
{
    (void)ucPmxId;
    (void)u4Number;
    (void)pu4PlaneOrder;
}

/** Put the plane selectors into their initial state.
 *  @param ucPmxId  mixer id */
void PMX_HalInitPlaneOrder(UCHAR ucPmxId)
{
    (void)ucPmxId;
}

/** Program the eight plane selectors.
 *  The layer below guarantees that on success it has written all eight delays.
 *  @param      ucPmxId      mixer id
 *  @param[in]  pu1PlnSel    [8] eight source numbers 0 to 7, plane 0 first
 *  @param[out] pi4PlnDelay  [8] receives eight delays of the new arrangement, plane 0 first, in the hardware's unit
 *  @return 0; anything else when the order is refused */
INT32 PMX_HalSetPlaneOrder(UCHAR ucPmxId, const UINT8* pu1PlnSel, INT32* pi4PlnDelay)
{
    (void)ucPmxId;
    (void)pu1PlnSel;
    (void)pi4PlnDelay;
    return 0;
}

/** Read the eight plane selectors.
 *  @param      ucPmxId    mixer id
 *  @param[out] pu1PlnSel  [8] receives eight source numbers, plane 0 first
 *  @return 0; anything else when they cannot be read */
INT32 PMX_HalGetPlaneOrder(UCHAR ucPmxId, UINT8* pu1PlnSel)
{
    (void)ucPmxId;
    (void)pu1PlnSel;
    return 0;
}

/** Put a plane into the mix. Called in the timer's context too.
 *  @param ucPmxId  mixer id
 *  @param ucPlane  plane 0 to 7, a DRV_PMX_PLANE_T value */
void vPmxMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
{
    (void)ucPmxId;
    (void)ucPlane;
}

/** Take a plane out of the mix.
 *  @param ucPmxId  mixer id
 *  @param ucPlane  plane 0 to 7, a DRV_PMX_PLANE_T value */
void vPmxNotMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
{
    (void)ucPmxId;
    (void)ucPlane;
}

/** Ask whether a plane is in the mix.
 *  @param ucPmxId  mixer id
 *  @param ucPlane  plane 0 to 7, a DRV_PMX_PLANE_T value
 *  @return TRUE or FALSE */
BOOL fgPmxHalMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
{
    (void)ucPmxId;
    (void)ucPlane;
    return 0;
}

/** Swap planes 1 and 2, and with them the two video planes, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane1_2(UCHAR ucPmxId, UINT32 u4Swap)
{
    (void)ucPmxId;
    (void)u4Swap;
}

/** Swap planes 3 and 4, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane3_4(UCHAR ucPmxId, UINT32 u4Swap)
{
    (void)ucPmxId;
    (void)u4Swap;
}

/** Swap planes 6 and 7, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane6_7(UCHAR ucPmxId, UINT32 u4Swap)
{
    (void)ucPmxId;
    (void)u4Swap;
}

/** Swap planes 4 and 7, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane4_7(UCHAR ucPmxId, UINT32 u4Swap)
{
    (void)ucPmxId;
    (void)u4Swap;
}

/** Swap planes 1 and 3, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane1_3(UCHAR ucPmxId, UINT32 u4Swap)
{
    (void)ucPmxId;
    (void)u4Swap;
}

/** Swap planes 5 and 8, or undo it.
 *  @param ucPmxId  mixer id
 *  @param u4Swap   0 undo, anything else swap */
void PMX_HalSwapPlane5_8(UCHAR ucPmxId, UINT32 u4Swap)
{
    (void)ucPmxId;
    (void)u4Swap;
}

/** Ask whether the two video planes have traded mixer planes 1 and 2.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane1_2(UCHAR ucPmxId)
{
    (void)ucPmxId;
    return 0;
}

/** Ask whether planes 3 and 4 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane3_4(UCHAR ucPmxId)
{
    (void)ucPmxId;
    return 0;
}

/** Ask whether planes 6 and 7 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane6_7(UCHAR ucPmxId)
{
    (void)ucPmxId;
    return 0;
}

/** Ask whether planes 4 and 7 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane4_7(UCHAR ucPmxId)
{
    (void)ucPmxId;
    return 0;
}

/** Ask whether planes 1 and 3 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane1_3(UCHAR ucPmxId)
{
    (void)ucPmxId;
    return 0;
}

/** Ask whether planes 5 and 8 are swapped.
 *  @param ucPmxId  mixer id
 *  @return TRUE or FALSE */
BOOL fgPmxHalSwapPlane5_8(UCHAR ucPmxId)
{
    (void)ucPmxId;
    return 0;
}

/** Select the colour converter of the video-out path.
 *  @param ucPmxId   mixer id
 *  @param ucSelect  selector, always 1 */
void PMX_HalSelectVdoutCconv(UCHAR ucPmxId, UCHAR ucSelect)
{
    (void)ucPmxId;
    (void)ucSelect;
}

/** Select the colour converter of the scaler's path.
 *  @param ucPmxId   mixer id
 *  @param ucSelect  selector, always 0 */
void PMX_HalSelectScalerCconv(UCHAR ucPmxId, UCHAR ucSelect)
{
    (void)ucPmxId;
    (void)ucSelect;
}

/** Set converter CC_A behind the mixer.
 *  @param ucPmxId      mixer id
 *  @param ucEnable     1 on, 0 off
 *  @param ucDirection  1 BT.709 to BT.601, 0 BT.601 to BT.709 */
void PMX_HalSetCC_A(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucDirection)
{
    (void)ucPmxId;
    (void)ucEnable;
    (void)ucDirection;
}

/** Set the scaler's colour converter.
 *  @param ucPmxId      mixer id
 *  @param ucEnable     1 on, 0 off
 *  @param ucDirection  1 BT.709 to BT.601; 0 when off */
void PMX_HalSetScaler709601(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucDirection)
{
    (void)ucPmxId;
    (void)ucEnable;
    (void)ucDirection;
}

/** Fit the active zone to a resolution mode.
 *  @param ucPmxId  mixer id
 *  @param ucMode   a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm */
void PMX_HalSetActiveZone(UCHAR ucPmxId, UCHAR ucMode)
{
    (void)ucPmxId;
    (void)ucMode;
}

/** Set the width of the colour bars.
 *  @param ucPmxId  mixer id
 *  @param u1Width  width in the hardware's unit */
void PMX_HalSetCBWidth(UCHAR ucPmxId, UINT8 u1Width)
{
    (void)ucPmxId;
    (void)u1Width;
}

/** Show the colour bars.
 *  @param ucPmxId  mixer id */
void PMX_HalEnableCB(UCHAR ucPmxId)
{
    (void)ucPmxId;
}

/** Stop showing the colour bars.
 *  @param ucPmxId  mixer id */
void PMX_HalDisableCB(UCHAR ucPmxId)
{
    (void)ucPmxId;
}

/** Mute the mixer's output.
 *  @param ucPmxId  mixer id */
void PMX_HalEnableMute(UCHAR ucPmxId)
{
    (void)ucPmxId;
}

/** Release the mute.
 *  @param ucPmxId  mixer id */
void PMX_HalDisableMute(UCHAR ucPmxId)
{
    (void)ucPmxId;
}

/** Set a video path's delay.
 *  @param ucVdoId   video path
 *  @param ucADJ_F   field adjustment
 *  @param u2HDelay  horizontal delay in the hardware's unit
 *  @param u2VDelay  vertical delay in the hardware's unit */
void PMX_HalSetDelay(UCHAR ucVdoId, UCHAR ucADJ_F, UINT16 u2HDelay, UINT16 u2VDelay)
{
    (void)ucVdoId;
    (void)ucADJ_F;
    (void)u2HDelay;
    (void)u2VDelay;
}

/** Set the mixer's brightness.
 *  @param ucPmxId       mixer id
 *  @param ucBrightness  128 = neutral */
void PMX_HalSetBrightness(UCHAR ucPmxId, UCHAR ucBrightness)
{
    (void)ucPmxId;
    (void)ucBrightness;
}

/** Set the mixer's contrast.
 *  @param ucPmxId     mixer id
 *  @param ucContrast  128 = neutral */
void PMX_HalSetContrast(UCHAR ucPmxId, UCHAR ucContrast)
{
    (void)ucPmxId;
    (void)ucContrast;
}

/** Set the gamma curve.
 *  @param     ucPmxId   mixer id
 *  @param     ucEnable  1 on, 0 off
 *  @param[in] pucCurve  [9] nine output levels at equally spaced inputs from 0 to 255; null when off */
void PMX_HalSetGamma(UCHAR ucPmxId, UCHAR ucEnable, const UCHAR* pucCurve)
{
    (void)ucPmxId;
    (void)ucEnable;
    (void)pucCurve;
}

/** Set the parallel digital port.
 *  @param ucPmxId            mixer id
 *  @param ucEnable           0 off, anything else on
 *  @param ucProprietaryMode  vendor mode code
 *  @param ucDigitalBit       bus width in bits */
void PMX_HalSetDigitalOut(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucProprietaryMode, UCHAR ucDigitalBit)
{
    (void)ucPmxId;
    (void)ucEnable;
    (void)ucProprietaryMode;
    (void)ucDigitalBit;
}

/** Set the digital picture's colour format.
 *  @param ucPmxId       mixer id
 *  @param ucDigitalRgb  a PLA_MXR_DIGITAL_OUTPUT_FMT_T value; any other value may come and must do no harm */
void PMX_HalSetDigitalOutRgb(UCHAR ucPmxId, UCHAR ucDigitalRgb)
{
    (void)ucPmxId;
    (void)ucDigitalRgb;
}

/** Set the digital port's clock phase.
 *  @param ucPmxId  mixer id
 *  @param u4Phase  phase in the hardware's unit */
void PMX_HalSetDigitalOutPhase(UCHAR ucPmxId, UINT32 u4Phase)
{
    (void)ucPmxId;
    (void)u4Phase;
}

/** Set the digital port's pad drive strength.
 *  @param u4Drving  strength in the hardware's unit */
void PMX_HalSetDigitalOutDrv(UINT32 u4Drving)
{
    (void)u4Drving;
}

/** Set up vertical-sync handling. */
void PMX_VsyncInit(void)
{
}

/** Tear vertical-sync handling down. */
void PMX_VsyncStop(void)
{
}

/** Start vertical-sync interrupts. */
void PMX_VsyncEnable(void)
{
}

/** Stop vertical-sync interrupts. */
void PMX_VsyncDisable(void)
{
}

/* drv_tve.h */

/** Set an encoder's format.
 *  @param u4Tve        TVE_1 or TVE_2
 *  @param ucMainFmt    the mixer's mode, a PMX_RESOLUTION_MODE_T value
 *  @param ucVFreq      vertical frequency in Hz
 *  @param ucTargetFmt  the output's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @param fgEnable     the output is on
 *  @param fgHD         the mixer's format is an HD one
 *  @param fgOSD5       routing of the fifth OSD plane: 0, 1 or 2; any other value may come and must do no harm
 *  @return TVE_SET_OK, anything else is a failure */
UINT32 TVE_SetFmtEx(UINT32 u4Tve, UCHAR ucMainFmt, UCHAR ucVFreq, UCHAR ucTargetFmt, BOOL fgEnable, BOOL fgHD,
                    UINT8 fgOSD5)
{
    (void)u4Tve;
    (void)ucMainFmt;
    (void)ucVFreq;
    (void)ucTargetFmt;
    (void)fgEnable;
    (void)fgHD;
    (void)fgOSD5;
    return 0;
}

/** Switch an encoder on or off.
 *  @param u4Tve     TVE_1 or TVE_2
 *  @param fgEnable  on */
void TVE_SetEnable(UINT32 u4Tve, BOOL fgEnable)
{
    (void)u4Tve;
    (void)fgEnable;
}

/** Announce a per-output mode setting; called on every one, before the formats.
 *  @param fgFmtChange  the mixer's format changes
 *  @param ucCavFmt     component's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @param ucCvbsFmt    composite's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @param fgHD         the mixer's format is an HD one
 *  @param fgOSD5       routing of the fifth OSD plane: 0, 1 or 2; any other value may come and must do no harm */
void TVE_SetMuteCtrol(BOOL fgFmtChange, UCHAR ucCavFmt, UCHAR ucCvbsFmt, BOOL fgHD, UINT8 fgOSD5)
{
    (void)fgFmtChange;
    (void)ucCavFmt;
    (void)ucCvbsFmt;
    (void)fgHD;
    (void)fgOSD5;
}

/** Blank an encoder's picture across a format change.
 *  @param u4Tve  TVE_1 or TVE_2
 *  @param fgOn   the driver's own switch; the mixer hands over 0 when it begins to change the format */
void TVE_SetBlackScreen(UINT32 u4Tve, BOOL fgOn)
{
    (void)u4Tve;
    (void)fgOn;
}

/** Set brightness of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetBrightness(UCHAR ucValue)
{
    (void)ucValue;
}

/** Set contrast of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetContrast(UCHAR ucValue)
{
    (void)ucValue;
}

/** Set hue of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetHue(UCHAR ucValue)
{
    (void)ucValue;
}

/** Set saturation of the analogue outputs.
 *  @param ucValue  128 = neutral */
void TVE_SetSaturation(UCHAR ucValue)
{
    (void)ucValue;
}

/** Set sharpness of the analogue outputs.
 *  @param ucValue  the driver's unit; 0 after a reset */
void TVE_SetSharpness(UCHAR ucValue)
{
    (void)ucValue;
}

/** Set the black level (set-up) of the analogue outputs.
 *  @param ucCAVEn   component's switch
 *  @param ucCVBSEn  composite's switch */
void TVE_SetBlackLvl(UCHAR ucCAVEn, UCHAR ucCVBSEn)
{
    (void)ucCAVEn;
    (void)ucCVBSEn;
}

/** Switch composite's set-up on or off.
 *  @param fgEnable  on */
void TVE_CVBSSetup_En(BOOL fgEnable)
{
    (void)fgEnable;
}

/** Switch composite's PAL-60 on or off.
 *  @param fgEnable  on */
void TVE_CVBSPal60_En(BOOL fgEnable)
{
    (void)fgEnable;
}

/** Tell the encoders the kind of medium that plays.
 *  @param ucMediaType  the middleware's code */
void TVE_Identify_Mediatype(UCHAR ucMediaType)
{
    (void)ucMediaType;
}

/** Set the widescreen signalling.
 *  @param eAspect  the aspect to signal */
void TVE_SetAspectRatio(TVE_ASPECT_RATIO_T eAspect)
{
    (void)eAspect;
}

/* drv_vdp.h */

/** Tell the driver the output's TV format.
 *  @param ucMode     a PMX_RESOLUTION_MODE_T value
 *  @param fgChanged  1 after the format has been programmed anew, be the mode the same or not; 0 when the mixer's
 *                    format stays
 *  @context a thread that may sleep */
void VDP_SetTvFormat(UCHAR ucMode, BOOL fgChanged)
{
    (void)ucMode;
    (void)fgChanged;
}

/** Have every video plane recompute its output geometry; the driver asks the mixer for what it needs.
 *  @context a thread that may sleep */
void VDP_GlobalOutputChange(void)
{
}

/** Give a video plane a command that it carries out at its next vertical sync.
 *  @param u4VdpIdx  video plane 0, 1 or 2
 *  @param u4Cmd     VDP_CMD_OUTPUT_CHANGED or VDP_CMD_ORDER_CHANGES
 *  @context a thread that may sleep */
void VDP_VsyncSendCmd(UINT32 u4VdpIdx, UINT32 u4Cmd)
{
    (void)u4VdpIdx;
    (void)u4Cmd;
}

/** Fill a video plane with one colour.
 *  @param ucVdpId  video plane
 *  @param ucY      luma
 *  @param ucU      blue difference
 *  @param ucV      red difference
 *  @context a thread that may sleep */
void VDP_SetClearVideo(UCHAR ucVdpId, UCHAR ucY, UCHAR ucU, UCHAR ucV)
{
    (void)ucVdpId;
    (void)ucY;
    (void)ucU;
    (void)ucV;
}

/** Ask for a video plane's hardware enable state.
 *  @param ucVdpId  video plane 0 or 1
 *  @return its state
 *  @context any thread */
VDP_ENABLE_T VDP_GetHwEnable(UCHAR ucVdpId)
{
    (void)ucVdpId;
    return 0;
}

/** Switch closed captions on or off.
 *  @param fgEnable  on
 *  @context a thread that may sleep */
void VDP_EnableCC(BOOL fgEnable)
{
    (void)fgEnable;
}

/** Ask whether a change still waits for the planes' sync control. Asked in the timer's context too. After TRUE,
 *  somebody in the stack calls PMX_SetOsdEnable once it turns FALSE: until then graphics stay out of the mix.
 *  @return TRUE or FALSE
 *  @context any thread, and the timer's */
BOOL fgVdpIsWaitforSyncCtrl(void)
{
    return 0;
}

/* drv_osd.h */

/** Tell the OSD driver the display mode; called before mixer and scaler are programmed, and by one-mode setting for an
 *  unchanged mode too.
 *  @param ucMode  a PMX_RESOLUTION_MODE_T value */
void OSD_BASE_SetDisplayMode(UCHAR ucMode)
{
    (void)ucMode;
}

/** Tell the OSD driver that a mode setting has come to its end. */
void OSD_BASE_SetFlag_PMXChangeResDone(void)
{
}

/** Tell the OSD driver the mixer's colour space.
 *  @param ucColorSpace  a DRV_PMX_COLOR_SPACE_T value */
void OSDSetColorSpace(UCHAR ucColorSpace)
{
    (void)ucColorSpace;
}

/** Enable full-range conversion of OSD pixels, or disable it.
 *  @param fgEnable  on */
void OSD_RNG_Set_Xvycc_En(BOOL fgEnable)
{
    (void)fgEnable;
}

/** Set the position offsets of the OSD planes.
 *  @param[in] pi4Offset  [5] five offsets in the hardware's unit, negative ones included; the driver must not keep the
 *                        pointer
 *  @return the driver's result, which the mixer ignores */
INT32 _i4OSD_SetPosOffset(INT32* pi4Offset)
{
    (void)pi4Offset;
    return 0;
}

/** Show the fifth OSD plane on component and composite, or on neither.
 *  @param fgOn        1 show, 0 do not
 *  @param ucCvbsMode  composite's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @return the driver's result, which the mixer ignores */
INT32 _i4Osd5Out(BOOL fgOn, UCHAR ucCvbsMode)
{
    (void)fgOn;
    (void)ucCvbsMode;
    return 0;
}

/** Show the fifth OSD plane on composite alone.
 *  @param fgOn        1 show
 *  @param ucCvbsMode  composite's mode, a PMX_RESOLUTION_MODE_T value; any other may come and must do no harm
 *  @return the driver's result, which the mixer ignores */
INT32 _i4Osd5Out_CVBSOnly(BOOL fgOn, UCHAR ucCvbsMode)
{
    (void)fgOn;
    (void)ucCvbsMode;
    return 0;
}

/** Set the delays of the two video planes in display control.
 *  @param i4Delay1  first video plane's delay in the hardware's unit, may be negative
 *  @param i4Delay2  second video plane's delay in the hardware's unit, may be negative */
void DCM_SetVideoPlaneDelay(INT32 i4Delay1, INT32 i4Delay2)
{
    (void)i4Delay1;
    (void)i4Delay2;
}

/* drv_av_d.h */

/** Command the driver. It takes a copy of what it needs before it returns.
 *  @param     u4Command    a PMX_AVD_COMMAND_T value
 *  @param[in] pvParameter  [by u4Command] the command's parameter
 *  @param     u4Length     always 1; the driver's own convention
 *  @return FALSE when it refuses
 *  @context a thread that may sleep */
BOOL fgPmxDrvSetAvd(UINT32 u4Command, void* pvParameter, UINT32 u4Length)
{
    (void)u4Command;
    (void)pvParameter;
    (void)u4Length;
    return 0;
}

/** Query the driver.
 *  @param         u4Query      a PMX_AVD_QUERY_T value
 *  @param[in,out] pvParameter  [by u4Query] the query's record; the driver fills its outputs when it answers TRUE
 *  @return FALSE when it has no answer
 *  @context a thread that may sleep */
BOOL fgPmxDrvGetAvdInfo(UINT32 u4Query, void* pvParameter)
{
    (void)u4Query;
    (void)pvParameter;
    return 0;
}

/** Ask whether a sink is plugged in.
 *  @return 1 when it is
 *  @context a thread that may sleep */
INT32 i4GetHotPlugStatus(void)
{
    return 0;
}

/** Ask whether a hot-plug event wants the HDMI resolution sent again.
 *  @return TRUE or FALSE
 *  @context a thread that may sleep */
BOOL fgIsHotPlugChgRes(void)
{
    return 0;
}

/** Tell the driver that the mixer runs a new format.
 *  @param ucMode  a PMX_RESOLUTION_MODE_T value
 *  @context a thread that may sleep */
void vPostChgRes(UCHAR ucMode)
{
    (void)ucMode;
}

/** Report a new master colour space.
 *  @param eColorSpace  the colour space
 *  @context a thread that may sleep */
void vPostChgInputCS(DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    (void)eColorSpace;
}

/** Tell the driver that a mode setting ended without an HDMI change.
 *  @context a thread that may sleep */
void vSendAvdNotifyScomResChgOK(void)
{
}

/** Select where the digital port takes its picture.
 *  @param fgBeforeMixer  0 behind the mixer, anything else before it
 *  @context a thread that may sleep */
void vSetCcirOutBeforeMixer(BOOL fgBeforeMixer)
{
    (void)fgBeforeMixer;
}

/* Unloading */

void vPortUnload(void);

/** Shut the layer down and leave no timer behind: an expiry after this would call code that is gone. Whatever the
 *  expiry function reaches (console, mixing of planes, the video plane driver's answer) is still there. */
void vPortUnload(void)
{
    HANDLE_T hTimer;

    PMX_Uninit();
    for (hTimer = 1; hTimer <= PORT_TIMERS; hTimer++)
    {
        if (fgTimerExists(hTimer))
            x_timer_delete(hTimer);
    }
}
