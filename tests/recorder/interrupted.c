// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A stack in which another context enters the layer at moments that are hardly ever hit by chance: whenever the
 * recorder has taken a place in the ring, or has looked whether somebody else has.
 *
 * usage: interrupted between FILE   at every such moment, while the mode changes
 *        interrupted torn FILE      while every other snapshot is taken
 *        interrupted turns FILE     two contexts take turns, and each sees what the other one did
 *        interrupted planes FILE    two threads inform a video plane each, and neither has a table yet
 *        interrupted full FILE      there is no room for what a text means */
#define _DEFAULT_SOURCE
#include <fcntl.h>
#include <pthread.h>
#include <semaphore.h>
#include <stdio.h>
#include <string.h>
#include <sys/mman.h>
#include <unistd.h>

#define i4ImQueryInterface i4SkeletonQueries
#include "port_skeleton.c" // NOLINT(bugprone-suspicious-include): a stack is one program here
#undef i4ImQueryInterface

#include "drv_if_vdp.h"
#include "interrupted.h"
#include "pmx_recorder.h"

#define RING_SIZE 65536u
#define MEMORY_SIZE PMX_RECORDER_MEMORY(RING_SIZE)

static _Thread_local UINT32 u4Context;   /* 0: the program itself; 1: whoever enters in between */
static void (*pfAdded)(UINT32 u4Number); /* 0: nothing, it was looked at */
static void (*pfLooked)(void);

UINT32 u4InterruptedAdd(UINT32* pu4Word, UINT32 u4Number)
{
    const UINT32 u4Before = __atomic_fetch_add(pu4Word, u4Number, __ATOMIC_SEQ_CST);
    if (pfAdded != 0)
        pfAdded(u4Number);
    return u4Before;
}

UINT32 u4InterruptedLoad(const UINT32* pu4Word)
{
    const UINT32 u4Found = __atomic_load_n(pu4Word, __ATOMIC_SEQ_CST);
    if (pfAdded != 0)
        pfAdded(0);
    return u4Found;
}

UINT32 u4InterruptedLook(const UINT32* pu4Word)
{
    const UINT32 u4Found = __atomic_load_n(pu4Word, __ATOMIC_SEQ_CST);
    if (pfLooked != 0)
        pfLooked();
    return u4Found;
}

static UINT32 u4Time(void)
{
    static UINT32 u4Now;
    return __atomic_add_fetch(&u4Now, 1, __ATOMIC_RELAXED);
}

static UINT32 u4Thread(void)
{
    return u4Context;
}

/* The recorder's memory; null when it cannot be had. */
static UCHAR* pucRecordInto(const char* szFile)
{
    const int iFile = open(szFile, O_RDWR | O_CREAT | O_TRUNC, 0600);
    PMX_RECORDER_SETUP_T rHow = { 0, MEMORY_SIZE, u4Time, u4Thread, 1000, FALSE };
    if (iFile < 0 || ftruncate(iFile, MEMORY_SIZE) != 0)
        return 0;
    rHow.pvMemory = mmap(0, MEMORY_SIZE, PROT_READ | PROT_WRITE, MAP_SHARED, iFile, 0);
    if (rHow.pvMemory == MAP_FAILED || fgPmxRecorderStart(&rHow) == FALSE)
        return 0;
    return rHow.pvMemory;
}

static void vChangeMode(UINT32 u4Change)
{
    static const PMX_RESOLUTION_MODE_T aeMode[] = { RES_720P50HZ, RES_480P, RES_1080I60HZ };
    PMX_RESOLUTION_T arOutputs[PMX_OUTPUT_NUM];
    const UCHAR ucFrequency = u4Change % 3 == 0 ? 50 : 60;
    memset(arOutputs, 0, sizeof arOutputs);
    arOutputs[PMX_OUTPUT_HDMI].fgOutputEnable = TRUE;
    arOutputs[PMX_OUTPUT_HDMI].eResMode = aeMode[u4Change % 3];
    arOutputs[PMX_OUTPUT_HDMI].u4VFreq = ucFrequency;
    PMX_SetModeEx(0, arOutputs, ucFrequency, DRV_NON_EXT_CHIP, 0);
}

/* Stores something else each time, or sees what is stored. */
static void vEnterOnce(UINT32 u4Number)
{
    UCHAR ucFound;
    if (u4Number % 2 == 0)
        PMX_SetTvType(0, (UCHAR)(u4Number / 2));
    else
        PMX_GetTvType(0, &ucFound);
}

static void vEnterBetween(UINT32 u4Added)
{
    static UINT32 u4Number;
    UCHAR ucMode;
    (void)u4Added;
    if (u4Context != 0)
        return;
    u4Context = 1;
    vEnterOnce(++u4Number);
    PMX_GetMode(0, &ucMode);
    u4Context = 0;
}

/* Nothing else here takes so many words. */
static void vEnterSnapshot(UINT32 u4Added)
{
    static UINT32 u4Snapshots;
    if (u4Added > 100 && u4Added <= PMX_RECORDER_LONGEST && u4Snapshots++ % 2 == 0)
        vEnterBetween(u4Added);
}

static void vChangeModes(void (*pfEnter)(UINT32 u4Added))
{
    UINT32 i;
    PMX_Init();
    pfAdded = pfEnter;
    for (i = 0; i < 30; ++i)
        vChangeMode(i);
    pfAdded = 0;
}

static void vTurns(void)
{
    UINT32 i;
    PMX_Init();
    for (i = 0; i < 400; ++i)
    {
        u4Context = i % 2;
        vEnterOnce(i);
    }
    u4Context = 0;
}

/* Of each plane: only it knows its tag. */

static UINT32 au4Informed[2];
static UINT32 u4Mistaken;

static UINT32 u4Informed(void* pvTag, size_t zPlane)
{
    if ((size_t)pvTag != zPlane + 1)
        ++u4Mistaken;
    ++au4Informed[zPlane];
    return 1;
}

static UINT32 u4InformFirst(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    (void)eColorSpace;
    return u4Informed(pvTag, 0);
}

static UINT32 u4InformSecond(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    (void)eColorSpace;
    return u4Informed(pvTag, 1);
}

INT32 i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag)
{
    static const IVdp arPlane[] = { { .pu4SetColorMode = u4InformFirst }, { .pu4SetColorMode = u4InformSecond } };
    (void)u4IfId;
    if (u2CompType != PMX_COMP_TYPE_VDP || u2CompId > 1)
        return -1;
    *ppvIf = (void*)(size_t)&arPlane[u2CompId];
    *ppvTag = (void*)(size_t)(u2CompId + 1u);
    return 0;
}

static sem_t rFirstMayGoOn;
static sem_t rSecondMayGoOn;
static pthread_t rSecond;
static UINT32 u4Begun;
static UINT32 u4Waited;
static _Thread_local BOOL fgHasLooked;

static void* pvInformSecond(void* pvNothing)
{
    u4Context = 1;
    i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 0);
    i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 1);
    PMX_InformVdpColorSpace(0);
    sem_post(&rFirstMayGoOn);
    return pvNothing;
}

/* The first thread has seen that there is room for a table; before it does anything with that, the second one has. */
static void vHasLooked(void)
{
    fgHasLooked = TRUE;
    if (u4Context != 0 || u4Begun++ != 0)
        return;
    if (pthread_create(&rSecond, 0, pvInformSecond, 0) == 0)
        sem_wait(&rFirstMayGoOn);
}

/* The second one calls its plane when the first one has come to its end. */
static void vHasAdded(UINT32 u4Added)
{
    (void)u4Added;
    if (u4Context == 0 || !fgHasLooked || u4Waited++ != 0)
        return;
    sem_post(&rFirstMayGoOn);
    sem_wait(&rSecondMayGoOn);
}

static int iPlanes(void)
{
    sem_init(&rFirstMayGoOn, 0, 0);
    sem_init(&rSecondMayGoOn, 0, 0);
    PMX_Init();
    i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 0);
    pfAdded = vHasAdded;
    pfLooked = vHasLooked;
    PMX_InformVdpColorSpace(0);
    sem_post(&rSecondMayGoOn);
    if (u4Begun == 0 || pthread_join(rSecond, 0) != 0 || u4Waited == 0)
        return 1;
    printf("%u %u, %u mistaken\n", au4Informed[0], au4Informed[1], u4Mistaken);
    return 0;
}

/* As if the layer had more texts than there are places. */
static void vFull(UCHAR* pucMemory)
{
    PMX_RECORDER_TEXT_T* const prText =
        (PMX_RECORDER_TEXT_T*)(void*)(pucMemory + MEMORY_SIZE - PMX_RECORDER_TEXTS * sizeof(PMX_RECORDER_TEXT_T));
    UINT32 i;
    for (i = 0; i < PMX_RECORDER_TEXTS; ++i)
        prText[i].u4Key = prText[i].u4Claimed = i + 1;
    PMX_Init();
    vChangeMode(0);
}

int main(int iCount, char** pszWords)
{
    UCHAR* const pucMemory = iCount == 3 ? pucRecordInto(pszWords[2]) : 0;
    if (pucMemory == 0)
        return 2;
    if (strcmp(pszWords[1], "planes") == 0)
        return iPlanes();
    if (strcmp(pszWords[1], "between") == 0)
        vChangeModes(vEnterBetween);
    else if (strcmp(pszWords[1], "torn") == 0)
        vChangeModes(vEnterSnapshot);
    else if (strcmp(pszWords[1], "turns") == 0)
        vTurns();
    else if (strcmp(pszWords[1], "full") == 0)
        vFull(pucMemory);
    return 0;
}
