// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Holds a port against the contracts that the layer relies on, on the machine that the port runs on. Link it with
 * the port and call i4PortSelftest, before PMX_Init; compiled with PORT_SELFTEST_MAIN it has a main of its own, which
 * prints by the C library. It needs nothing else but the platform's headers and functions.
 *
 * Each contract is a line in the form of TAP, "ok 1 - x_timer_start: …" or "not ok 1 - …"; before each group of them a
 * comment, "# x_timer_start", names the functions that are called next, for a crash tells no more. The default part
 * changes nothing that is seen or heard: it makes semaphores and timers of its own and deletes them, sleeps for some
 * seconds, and asks drivers what they know. The hardware's part programs the mixer: the picture may jump.
 *
 * What a single thread cannot see is not here: that a mutex keeps others out, that an expiry cannot sleep. */
#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "u_os.h"

typedef void (*port_selftest_line_fct)(const char* szLine);

int i4PortSelftest(BOOL fgHardware, port_selftest_line_fct pfLine);

#define LINE_SIZE 160
#define NO_HANDLE 0
#define PLANES 8
#define TEXT_SIZE 64
#define UNTOUCHED 0xA5

/* Of a component that no stack has. */
#define TEST_COMPONENT 0x7FFE
#define TEST_INTERFACE 0x7FFFFFFE

static port_selftest_line_fct pfTell;
static unsigned u4Checks;
static unsigned u4Failures;

static char* pcAppend(char* pcTo, const char* pcEnd, const char* szText)
{
    while (*szText != '\0' && pcTo < pcEnd)
        *pcTo++ = *szText++;
    *pcTo = '\0';
    return pcTo;
}

static char* pcAppendNumber(char* pcTo, const char* pcEnd, unsigned u4Number)
{
    char acDigits[11];
    char* pcDigit = acDigits + sizeof acDigits - 1;

    *pcDigit = '\0';
    do
    {
        *--pcDigit = (char)('0' + u4Number % 10);
        u4Number /= 10;
    }
    while (u4Number != 0);
    return pcAppend(pcTo, pcEnd, pcDigit);
}

static void vTell(BOOL fgMet, const char* szWhat, const char* szBehind)
{
    char acLine[LINE_SIZE] = "";
    const char* const pcEnd = acLine + sizeof acLine - 1;
    char* pcTo = pcAppend(acLine, pcEnd, fgMet ? "ok " : "not ok ");

    pcTo = pcAppendNumber(pcTo, pcEnd, ++u4Checks);
    pcTo = pcAppend(pcTo, pcEnd, " - ");
    pcTo = pcAppend(pcTo, pcEnd, szWhat);
    pcAppend(pcTo, pcEnd, szBehind);
    pfTell(acLine);
    if (!fgMet)
        u4Failures++;
}

static void vCheck(const char* szWhat, int i4Met)
{
    vTell(i4Met != 0, szWhat, "");
}

/* Told before they are called: who crashes tells nothing any more. */
static void vAbout(const char* szFunctions)
{
    char acLine[LINE_SIZE] = "";
    const char* const pcEnd = acLine + sizeof acLine - 1;

    pcAppend(pcAppend(acLine, pcEnd, "# "), pcEnd, szFunctions);
    pfTell(acLine);
}

/* What this machine has not cannot be wrong. */
static void vSkip(const char* szWhat, const char* szWhy)
{
    char acWhy[TEXT_SIZE] = "";
    const char* const pcEnd = acWhy + sizeof acWhy - 1;

    pcAppend(pcAppend(acWhy, pcEnd, " # SKIP "), pcEnd, szWhy);
    vTell(TRUE, szWhat, acWhy);
}

static void vFill(void* pvTo, unsigned u4Size)
{
    UINT8* pu1To = (UINT8*)pvTo;

    while (u4Size-- > 0)
        *pu1To++ = UNTOUCHED;
}

static int i4IsUntouched(const void* pvFrom, unsigned u4Size)
{
    const UINT8* pu1From = (const UINT8*)pvFrom;

    while (u4Size-- > 0)
    {
        if (*pu1From++ != UNTOUCHED)
            return 0;
    }
    return 1;
}

static int i4SameText(const char* szOne, const char* szOther)
{
    while (*szOne != '\0' && *szOne == *szOther)
    {
        szOne++;
        szOther++;
    }
    return *szOne == *szOther;
}

static int i4IsTruth(BOOL fgAnswer)
{
    return fgAnswer == TRUE || fgAnswer == FALSE;
}

/* Semaphores */

static void vCheckMutex(void)
{
    HANDLE_T hMutex = NO_HANDLE;

    vAbout("x_sema_create, x_sema_lock, x_sema_unlock, x_sema_delete");
    vCheck("x_sema_create: a mutex is created with OSR_OK", x_sema_create(&hMutex, X_SEMA_TYPE_MUTEX, 1) == OSR_OK);
    vCheck("x_sema_create: its handle is written, and is not 0", hMutex != NO_HANDLE);
    vCheck("x_sema_lock: a free mutex is taken with OSR_OK", x_sema_lock(hMutex, X_SEMA_OPTION_WAIT) == OSR_OK);
    vCheck("x_sema_unlock: its holder gives it back with OSR_OK", x_sema_unlock(hMutex) == OSR_OK);
    vCheck("x_sema_unlock: it is free again", x_sema_lock(hMutex, X_SEMA_OPTION_NOWAIT) == OSR_OK);
    x_sema_unlock(hMutex);
    vCheck("x_sema_delete: a free mutex is deleted with OSR_OK", x_sema_delete(hMutex) == OSR_OK);
    vCheck("x_sema_lock: handle 0 fails", x_sema_lock(NO_HANDLE, X_SEMA_OPTION_WAIT) != OSR_OK);
    vCheck("x_sema_unlock: handle 0 fails", x_sema_unlock(NO_HANDLE) != OSR_OK);
    vCheck("x_sema_delete: handle 0 fails", x_sema_delete(NO_HANDLE) != OSR_OK);
    vCheck("x_sema_lock: a handle that was deleted fails", x_sema_lock(hMutex, X_SEMA_OPTION_NOWAIT) != OSR_OK);
}

/* Timers. The times are long enough for a timer that is late by an eighth, and for a busy machine. */

#define INTERVAL_MS 200
#define EARLY_MS 20
#define STEP_MS 10
#define MOST_STEPS 200
#define LATER_MS 450

static volatile unsigned u4Expiries;
static volatile HANDLE_T hExpired;
static void* volatile pvExpired;
static char cArgument;

static void vExpiry(HANDLE_T hTimer, void* pvArg)
{
    u4Expiries++;
    hExpired = hTimer;
    pvExpired = pvArg;
}

static INT32 i4Start(HANDLE_T hTimer)
{
    u4Expiries = 0;
    return x_timer_start(hTimer, INTERVAL_MS, X_TIMER_FLAG_ONCE, vExpiry, &cArgument);
}

static void vAwaitExpiry(void)
{
    unsigned i;

    for (i = 0; i < MOST_STEPS && u4Expiries == 0; i++)
        x_thread_delay(STEP_MS);
}

static void vCheckExpiry(HANDLE_T hTimer)
{
    vCheck("x_timer_start: a stopped timer is started with OSR_OK", i4Start(hTimer) == OSR_OK);
    x_thread_delay(EARLY_MS);
    vCheck("x_timer_start: it does not run out before its time", u4Expiries == 0);
    vAwaitExpiry();
    vCheck("x_timer_start: it runs out", u4Expiries != 0);
    vCheck("x_timer_start: the expiry function is given the timer's handle", hExpired == hTimer);
    vCheck("x_timer_start: the expiry function is given the argument", pvExpired == &cArgument);
    x_thread_delay(LATER_MS);
    vCheck("x_timer_start: X_TIMER_FLAG_ONCE runs out once", u4Expiries == 1);
}

static void vCheckRestart(HANDLE_T hTimer)
{
    unsigned u4AfterFirst;

    i4Start(hTimer);
    x_thread_delay(INTERVAL_MS * 3 / 4);
    u4AfterFirst = u4Expiries;
    vCheck("x_timer_start: a running timer is started again with OSR_OK", i4Start(hTimer) == OSR_OK);
    x_thread_delay(INTERVAL_MS / 2);
    vCheck("x_timer_start: its full interval begins anew", u4AfterFirst == 0 && u4Expiries == 0);
    vAwaitExpiry();
    x_thread_delay(LATER_MS);
    vCheck("x_timer_start: started twice, it runs out once", u4Expiries == 1);
}

static void vCheckTimer(void)
{
    HANDLE_T hTimer = NO_HANDLE;

    vAbout("x_timer_create, x_timer_stop");
    vCheck("x_timer_create: a timer is created with OSR_OK", x_timer_create(&hTimer) == OSR_OK);
    vCheck("x_timer_create: its handle is written, and is not 0", hTimer != NO_HANDLE);
    vCheck("x_timer_stop: a timer that does not run is stopped with OSR_OK", x_timer_stop(hTimer) == OSR_OK);
    vAbout("x_timer_start, x_thread_delay");
    vCheckExpiry(hTimer);
    vCheckRestart(hTimer);
    vAbout("x_timer_stop, x_timer_start, x_thread_delay");
    i4Start(hTimer);
    vCheck("x_timer_stop: a running timer is stopped with OSR_OK", x_timer_stop(hTimer) == OSR_OK);
    x_thread_delay(LATER_MS);
    vCheck("x_timer_stop: it does not run out any more", u4Expiries == 0);
    vAbout("x_timer_delete, x_timer_start, x_timer_stop, x_thread_delay");
    i4Start(hTimer);
    vCheck("x_timer_delete: a running timer is deleted with OSR_OK", x_timer_delete(hTimer) == OSR_OK);
    x_thread_delay(LATER_MS);
    vCheck("x_timer_delete: it does not run out any more", u4Expiries == 0);
    vCheck("x_timer_start: handle 0 fails", i4Start(NO_HANDLE) != OSR_OK);
    vCheck("x_timer_stop: handle 0 fails", x_timer_stop(NO_HANDLE) != OSR_OK);
    vCheck("x_timer_delete: handle 0 fails", x_timer_delete(NO_HANDLE) != OSR_OK);
    vCheck("x_timer_start: a handle that was deleted fails", i4Start(hTimer) != OSR_OK);
}

/* A timer tells the time: the headers have no clock. */
static void vCheckSleep(void)
{
    HANDLE_T hTimer = NO_HANDLE;

    vAbout("x_thread_delay, x_timer_create, x_timer_start, x_timer_delete");
    x_timer_create(&hTimer);
    i4Start(hTimer);
    x_thread_delay(INTERVAL_MS * 3);
    vCheck("x_thread_delay: it sleeps at least as long as it is told", u4Expiries != 0);
    x_timer_delete(hTimer);
}

/* Formatting and console */

static INT32 i4Format(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, ...) DRV_PRINTF_FORMAT(3, 4);

static INT32 i4Format(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, ...)
{
    va_list rArgs;
    INT32 i4Length;

    va_start(rArgs, szFormat);
    i4Length = x_vsnprintf(szBuffer, zSize, szFormat, rArgs);
    va_end(rArgs);
    return i4Length;
}

static void vCheckFormat(void)
{
    CHAR acText[TEXT_SIZE];
    const CHAR* volatile szNull = NULL; /* so that no compiler sees it */
    INT32 i4Length;

    vAbout("x_vsnprintf");
    i4Length = i4Format(acText, sizeof acText, "%d,%s,%8X,%%", -7, "text", 0xC0DEu);
    vCheck("x_vsnprintf: numbers, texts and widths are formatted", i4SameText(acText, "-7,text,    C0DE,%"));
    vCheck("x_vsnprintf: it answers the text's length", i4Length == 18);
    vFill(acText, sizeof acText);
    i4Length = i4Format(acText, 4, "%s", "longer");
    vCheck("x_vsnprintf: a text that does not fit is cut, and has an end", i4SameText(acText, "lon"));
    vCheck("x_vsnprintf: nothing is written behind the end", i4IsUntouched(acText + 4, sizeof acText - 4));
    vCheck("x_vsnprintf: it answers the length of the whole text", i4Length == 6);
    i4Format(acText, sizeof acText, "%s", szNull);
    vCheck("x_vsnprintf: a null text is (null)", i4SameText(acText, "(null)"));
}

static void vCheckConsole(void)
{
    const CHAR* volatile szNull = NULL;

    vAbout("PMX_IsLog");
    PMX_IsLog(0, "port_selftest: PMX_IsLog, %s\n", szNull);
    vCheck("PMX_IsLog: it prints a null text and returns", 1);
    vAbout("Printf");
    Printf("port_selftest: Printf, %d\n", 1);
    vCheck("Printf: it prints and returns", 1);
    vAbout("UTIL_Printf");
    UTIL_Printf("port_selftest: UTIL_Printf, %d\n", 2);
    vCheck("UTIL_Printf: it prints and returns", 1);
    vAbout("Assert");
    Assert("0", "port_selftest.c", 0);
    vCheck("Assert: it reports and returns", 1);
}

/* Flash, registers, power management */

static void vCheckFlash(void)
{
    UINT8 au1Word[4];
    INT32 i4Partition;

    vAbout("get_part_id_by_name, i4NFBPartitionRead");
    vCheck("get_part_id_by_name: a partition that is not there is negative",
           get_part_id_by_name("port_selftest: none") < 0);
    vFill(au1Word, sizeof au1Word);
    vCheck("i4NFBPartitionRead: a negative id fails", i4NFBPartitionRead(-1, 0, au1Word, sizeof au1Word) < 0);
    vCheck("i4NFBPartitionRead: a failed read leaves the destination alone", i4IsUntouched(au1Word, sizeof au1Word));
    i4Partition = get_part_id_by_name("fast_init_param");
    if (i4Partition < 0)
    {
        vSkip("get_part_id_by_name: the boot loader's partition is there", "it is not, and 480p is set");
        vSkip("i4NFBPartitionRead: its first word is read", "no partition");
        vSkip("i4NFBPartitionRead: a read past the end fails", "no partition");
        return;
    }
    vCheck("get_part_id_by_name: the boot loader's partition is there", 1);
    vCheck("i4NFBPartitionRead: its first word is read",
           i4NFBPartitionRead(i4Partition, 0, au1Word, sizeof au1Word) == (INT32)sizeof au1Word);
    vFill(au1Word, sizeof au1Word);
    vCheck("i4NFBPartitionRead: a read past the end fails",
           i4NFBPartitionRead(i4Partition, 0xFFFFFFF0u, au1Word, sizeof au1Word) < 0 &&
               i4IsUntouched(au1Word, sizeof au1Word));
}

static int i4Nothing(void* pvParameter)
{
    (void)pvParameter;
    return 0;
}

static void vCheckPower(void)
{
    static const PM_OPERATIONS_T rOperations = { i4Nothing, i4Nothing };

    vAbout("register_pm_ops, unregister_pm_ops");
    vCheck("register_pm_ops: operations are registered with 0", register_pm_ops(&rOperations) == 0);
    register_pm_ops(&rOperations);
    vCheck("register_pm_ops: the same ones a second time do no harm", 1);
    vCheck("unregister_pm_ops: they are withdrawn with 0", unregister_pm_ops(&rOperations) == 0);
    unregister_pm_ops(&rOperations); /* where they were kept twice */
}

/* Interface manager */

static void vCheckInterfaces(void)
{
    static const int i4Table = 0;
    void* pvTable = NULL;
    void* pvTag = NULL;

    vAbout("i4ImQueryInterface, i4ImUnregisterInterface2, i4ImRegisterInterface2, i4ImReleaseInterface");
    vCheck("i4ImQueryInterface: what is not registered fails",
           i4ImQueryInterface(TEST_COMPONENT, 0, TEST_INTERFACE, &pvTable, &pvTag) < 0);
    vCheck("i4ImUnregisterInterface2: what is not registered fails",
           i4ImUnregisterInterface2(TEST_COMPONENT, 0, TEST_INTERFACE) < 0);
    vCheck("i4ImRegisterInterface2: a table is registered",
           i4ImRegisterInterface2(TEST_COMPONENT, 0, TEST_INTERFACE, &i4Table, &cArgument) >= 0);
    if (i4ImQueryInterface(TEST_COMPONENT, 0, TEST_INTERFACE, &pvTable, &pvTag) >= 0)
    {
        vCheck("i4ImQueryInterface: it yields the table", pvTable == &i4Table);
        vCheck("i4ImQueryInterface: it yields the tag", pvTag == &cArgument);
        vCheck("i4ImReleaseInterface: it is given back",
               i4ImReleaseInterface(TEST_COMPONENT, 0, TEST_INTERFACE, pvTag) >= 0);
    }
    else
    {
        vCheck("i4ImQueryInterface: it yields the table", 0);
        vCheck("i4ImQueryInterface: it yields the tag", 0);
        vCheck("i4ImReleaseInterface: it is given back", 0);
    }
    vCheck("i4ImUnregisterInterface2: the table is withdrawn",
           i4ImUnregisterInterface2(TEST_COMPONENT, 0, TEST_INTERFACE) >= 0);
    vCheck("i4ImUnregisterInterface2: it is gone",
           i4ImQueryInterface(TEST_COMPONENT, 0, TEST_INTERFACE, &pvTable, &pvTag) < 0);
}

/* What drivers answer who are only asked */

static void vCheckAnswers(void)
{
    VDP_ENABLE_T eEnable;

    vAbout("VDP_GetHwEnable");
    eEnable = VDP_GetHwEnable(0);
    vCheck("VDP_GetHwEnable: disabled, hidden or enabled",
           eEnable == VDP_DISABLED || eEnable == VDP_HIDDEN || eEnable == VDP_ENABLED);
    vAbout("fgVdpIsWaitforSyncCtrl");
    vCheck("fgVdpIsWaitforSyncCtrl: TRUE or FALSE", i4IsTruth(fgVdpIsWaitforSyncCtrl()));
    vAbout("i4GetHotPlugStatus");
    vCheck("i4GetHotPlugStatus: exactly 1 for a sink, else 0", i4GetHotPlugStatus() == 1 || i4GetHotPlugStatus() == 0);
    vAbout("fgIsHotPlugChgRes");
    vCheck("fgIsHotPlugChgRes: TRUE or FALSE", i4IsTruth(fgIsHotPlugChgRes()));
    vAbout("fgPmxHalMixPlane");
    vCheck("fgPmxHalMixPlane: TRUE or FALSE", i4IsTruth(fgPmxHalMixPlane(0, 0)));
    vCheck("fgPmxHalMixPlane: another mixer does no harm", i4IsTruth(fgPmxHalMixPlane(9, 0)));
    vAbout("fgPmxHalSwapPlane1_2");
    vCheck("fgPmxHalSwapPlane1_2: TRUE or FALSE", i4IsTruth(fgPmxHalSwapPlane1_2(0)));
    vCheck("fgPmxHalSwapPlane1_2: another mixer does no harm", i4IsTruth(fgPmxHalSwapPlane1_2(9)));
    vAbout("fgPmxHalSwapPlane3_4");
    vCheck("fgPmxHalSwapPlane3_4: TRUE or FALSE", i4IsTruth(fgPmxHalSwapPlane3_4(0)));
    vAbout("fgPmxHalSwapPlane6_7");
    vCheck("fgPmxHalSwapPlane6_7: TRUE or FALSE", i4IsTruth(fgPmxHalSwapPlane6_7(0)));
    vAbout("fgPmxHalSwapPlane4_7");
    vCheck("fgPmxHalSwapPlane4_7: TRUE or FALSE", i4IsTruth(fgPmxHalSwapPlane4_7(0)));
    vAbout("fgPmxHalSwapPlane1_3");
    vCheck("fgPmxHalSwapPlane1_3: TRUE or FALSE", i4IsTruth(fgPmxHalSwapPlane1_3(0)));
    vAbout("fgPmxHalSwapPlane5_8");
    vCheck("fgPmxHalSwapPlane5_8: TRUE or FALSE", i4IsTruth(fgPmxHalSwapPlane5_8(0)));
}

static int i4IsOrder(const UINT8* pu1Order)
{
    int i4Plane;

    for (i4Plane = 0; i4Plane < PLANES; i4Plane++)
    {
        if (pu1Order[i4Plane] >= PLANES)
            return 0;
    }
    return 1;
}

static void vCheckSelectors(void)
{
    UINT8 au1Order[PLANES];

    vAbout("PMX_HalGetPlaneOrder");
    vFill(au1Order, sizeof au1Order);
    vCheck("PMX_HalGetPlaneOrder: the selectors are read with 0", PMX_HalGetPlaneOrder(0, au1Order) == 0);
    vCheck("PMX_HalGetPlaneOrder: all eight are written, 0 to 7", i4IsOrder(au1Order));
}

static void vCheckAvd(void)
{
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T rQuery;
    UINT32 u4Untouched;
    UINT8 u1Byte = 0;

    vAbout("fgPmxDrvSetAvd, fgPmxDrvGetAvdInfo");
    vFill(&rQuery, sizeof rQuery);
    vCheck("fgPmxDrvSetAvd: a command that there is not is refused", fgPmxDrvSetAvd(99, &u1Byte, 1) == FALSE);
    vCheck("fgPmxDrvGetAvdInfo: a query that there is not has no answer", fgPmxDrvGetAvdInfo(99, &rQuery) == FALSE);
    u4Untouched = rQuery.u4ValidAutoRes;
    rQuery.u4ResCheck = RES_480P;
    rQuery.u2VsyncFreq = 60;
    if (fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &rQuery) == FALSE)
        vCheck("fgPmxDrvGetAvdInfo: outputs are filled by TRUE, and by nothing else",
               rQuery.u4ValidAutoRes == u4Untouched && rQuery.u2ValidAutoVfreq == (UINT16)u4Untouched);
    else
        vCheck("fgPmxDrvGetAvdInfo: outputs are filled by TRUE, and by nothing else",
               rQuery.u4ValidAutoRes != u4Untouched && rQuery.u2ValidAutoVfreq != (UINT16)u4Untouched);
}

/* What is seen on the screen */

static void vCheckDelays(void)
{
    UINT8 au1Order[PLANES] = { 0, 1, 2, 3, 4, 5, 6, 7 };
    UINT8 au1Before[PLANES];
    INT32 ai4Delay[PLANES];
    int i4Plane;
    int i4Written = 1;
    int i4Known;

    vAbout("PMX_HalSetPlaneOrder, PMX_HalGetPlaneOrder");
    vFill(au1Before, sizeof au1Before);
    i4Known = PMX_HalGetPlaneOrder(0, au1Before) == 0 && i4IsOrder(au1Before);
    vFill(ai4Delay, sizeof ai4Delay);
    vCheck("PMX_HalSetPlaneOrder: an order is set with 0", PMX_HalSetPlaneOrder(0, au1Order, ai4Delay) == 0);
    for (i4Plane = 0; i4Plane < PLANES; i4Plane++)
        i4Written &= !i4IsUntouched(&ai4Delay[i4Plane], sizeof ai4Delay[i4Plane]);
    vCheck("PMX_HalSetPlaneOrder: all eight delays are written", i4Written);
    vFill(au1Order, sizeof au1Order);
    PMX_HalGetPlaneOrder(0, au1Order);
    vCheck("PMX_HalGetPlaneOrder: it reads what was set", au1Order[0] == 0 && au1Order[7] == 7);
    if (i4Known)
        PMX_HalSetPlaneOrder(0, au1Before, ai4Delay);
}

static void vCheckMixing(void)
{
    BOOL fgMixed;
    BOOL fgAsTold;

    vAbout("fgPmxHalMixPlane, vPmxNotMixPlane, vPmxMixPlane");
    fgMixed = fgPmxHalMixPlane(0, 7);
    vPmxNotMixPlane(0, 7);
    fgAsTold = fgPmxHalMixPlane(0, 7) == FALSE;
    vPmxMixPlane(0, 7);
    fgAsTold = fgAsTold && fgPmxHalMixPlane(0, 7) == TRUE;
    if (fgMixed == FALSE)
        vPmxNotMixPlane(0, 7);
    vCheck("fgPmxHalMixPlane: a plane is mixed, and is not, as it was told", fgAsTold);
}

static void vCheckSwap(void)
{
    BOOL fgSwapped;
    BOOL fgAsTold;

    vAbout("fgPmxHalSwapPlane1_2, PMX_HalSwapPlane1_2");
    fgSwapped = fgPmxHalSwapPlane1_2(0);
    PMX_HalSwapPlane1_2(0, 1);
    fgAsTold = fgPmxHalSwapPlane1_2(0) == TRUE;
    PMX_HalSwapPlane1_2(0, 0);
    fgAsTold = fgAsTold && fgPmxHalSwapPlane1_2(0) == FALSE;
    PMX_HalSwapPlane1_2(0, fgSwapped);
    vCheck("fgPmxHalSwapPlane1_2: planes are swapped, and are not, as it was told", fgAsTold);
}

static void vCheckHardware(void)
{
    vCheckDelays();
    vCheckMixing();
    vCheckSwap();
    vAbout("TVE_SetFmtEx");
    vCheck("TVE_SetFmtEx: a format is set with TVE_SET_OK",
           TVE_SetFmtEx(TVE_1, RES_480P, 60, RES_480P, TRUE, FALSE, 0) == TVE_SET_OK);
}

/** Check the port that this is linked with.
 *  @param     fgHardware  the hardware's part, too
 *  @param[in] pfLine      is given each line, without its end
 *  @return 0 when every contract was met */
int i4PortSelftest(BOOL fgHardware, port_selftest_line_fct pfLine)
{
    char acPlan[TEXT_SIZE] = "";
    const char* const pcEnd = acPlan + sizeof acPlan - 1;

    pfTell = pfLine;
    u4Checks = 0;
    u4Failures = 0;
    vCheckConsole();
    vCheckMutex();
    vCheckTimer();
    vCheckSleep();
    vCheckFormat();
    vCheckFlash();
    vCheckPower();
    vCheckInterfaces();
    vCheckAnswers();
    vCheckSelectors();
    vCheckAvd();
    if (fgHardware)
        vCheckHardware();
    pcAppendNumber(pcAppend(acPlan, pcEnd, "1.."), pcEnd, u4Checks);
    pfTell(acPlan);
    return u4Failures == 0 ? 0 : 1;
}

#ifdef PORT_SELFTEST_MAIN

#include <stdio.h>

static void vPrint(const char* szLine)
{
    puts(szLine);
    fflush(stdout); /* before what comes next may crash */
}

/** With any argument the hardware's part runs, too. */
int main(int argc, char** argv)
{
    (void)argv;
    return i4PortSelftest(argc > 1, vPrint);
}

#endif
