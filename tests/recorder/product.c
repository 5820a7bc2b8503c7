// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A stack that is little more than the skeleton of a port, with the recorder as a product has it: its memory is a file
 * here, which outlives the program as a product's memory outlives a crash.
 *
 * usage: product FILE EVENT     the program kills itself inside that event, counted from 1; 0: never
 *        product +|- CHANGES     changes the mode so often, with a recorder or without; for counting instructions
 *        product print FILE|-    prints texts with values, with a recorder or without
 *        product refused -       asks for recorders that there cannot be, and goes on without */
#define _DEFAULT_SOURCE
#include <fcntl.h>
#include <signal.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/mman.h>
#include <unistd.h>

#include "u_os.h"

/* The skeleton prints nothing. */
#define x_vsnprintf iSkeletonFormats
#define UTIL_Printf vSkeletonPrints
#include "port_skeleton.c" // NOLINT(bugprone-suspicious-include): a stack is one program here
#undef x_vsnprintf
#undef UTIL_Printf

#include "pmx_recorder.h"

#define MEMORY_SIZE PMX_RECORDER_MEMORY(65536)

static BOOL fgPrints;

INT32 x_vsnprintf(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, va_list rArgs)
{
    return fgPrints != FALSE ? vsnprintf(szBuffer, zSize, szFormat, rArgs)
                             : iSkeletonFormats(szBuffer, zSize, szFormat, rArgs);
}

/* As a format once more, and no value of it is looked at. */
void UTIL_Printf(const CHAR* szFormat, ...)
{
    if (fgPrints != FALSE)
        puts(szFormat);
}

static UINT32 u4Events;
static UINT32 u4LastEvent;

static UINT32 u4Time(void)
{
    if (++u4Events == u4LastEvent)
        raise(SIGKILL);
    return u4Events;
}

static UINT32 u4Thread(void)
{
    return 0;
}

static void vChangeModes(UINT32 u4Times)
{
    static const UCHAR aucModes[] = { RES_720P50HZ, RES_480P, RES_1080I60HZ };
    PMX_RESOLUTION_T arOutputs[PMX_OUTPUT_NUM];
    UINT32 i;
    memset(arOutputs, 0, sizeof arOutputs);
    for (i = 0; i < u4Times; ++i)
    {
        UCHAR ucMode = 0;
        const DRV_EXT_CHIP_USAGE_T eNone = DRV_NON_EXT_CHIP;
        arOutputs[PMX_OUTPUT_HDMI].fgOutputEnable = TRUE;
        arOutputs[PMX_OUTPUT_HDMI].eResMode = (PMX_RESOLUTION_MODE_T)aucModes[i % 3];
        arOutputs[PMX_OUTPUT_HDMI].u4VFreq = i % 3 == 0 ? 50 : 60;
        PMX_SetModeEx(0, arOutputs, i % 3 == 0 ? 50 : 60, eNone, 0);
        PMX_GetMode(0, &ucMode);
        _PmxTestOsd = (BOOL)(i & 1); /* a tester's */
    }
}

static int iRecordInto(const char* szFile)
{
    const int iFile = open(szFile, O_RDWR | O_CREAT | O_TRUNC, 0600);
    PMX_RECORDER_SETUP_T rHow = { 0, MEMORY_SIZE, u4Time, u4Thread, 1000, FALSE };
    if (iFile < 0 || ftruncate(iFile, MEMORY_SIZE) != 0)
        return 1;
    rHow.pvMemory = mmap(0, MEMORY_SIZE, PROT_READ | PROT_WRITE, MAP_SHARED, iFile, 0);
    if (rHow.pvMemory == MAP_FAILED || fgPmxRecorderStart(&rHow) == FALSE)
        return 1;
    return 0;
}

/* These are the last letters of a page, and behind it nothing can be read: the text has no end. */
static char* pcOfPage(const char* szLetters)
{
    const size_t zPage = (size_t)sysconf(_SC_PAGESIZE);
    char* const pcPages = mmap(0, 2 * zPage, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    const size_t zLength = strlen(szLetters);
    if (pcPages == MAP_FAILED || mprotect(pcPages + zPage, zPage, PROT_NONE) != 0)
        abort();
    memcpy(pcPages + zPage - zLength, szLetters, zLength);
    return pcPages + zPage - zLength;
}

/* So many times the same letter. */
static const char* szMany(char cLetter, size_t zLength)
{
    char* const szText = calloc(zLength + 1, 1);
    if (szText == 0)
        abort();
    memset(szText, cLetter, zLength);
    return szText;
}

/* As long as what is printed at most, and longer; what is cut of a format takes its values along. */
static void vPrintLong(void)
{
    char acFormat[700];
    snprintf(acFormat, sizeof acFormat, "%s%%s.", szMany('f', 300));
    PMX_Printf(0, acFormat, szMany('v', 200));
    PMX_Printf(0, "%s%s", szMany('a', 500), szMany('b', 500));
    snprintf(acFormat, sizeof acFormat, "%%d%s%%d%%s", szMany('c', 550));
    PMX_Printf(0, acFormat, 7, 8, "behind");
}

/* What few print: numbers of all widths, as many as are handed on, and what libraries do not agree on. */
static void vPrintOdd(void)
{
    const char* volatile szNone = 0; /* or the compiler knows better */
    const char* volatile szStrange = "%.+{d";
    PMX_Printf(0, "%hd %zu %X", (short)3, (size_t)4, 0xABC);
    PMX_Printf(0, "%.3ld %.9999s %s", 2L, "precise", szNone);
    PMX_Printf(0, "%.511s", szMany('p', 600));
    PMX_Printf(0, "%d%d%d%d%d%d%d%d%d%d%d%d%d%d%d%d", 1, 2, 3, 4, 5, 6, 7, 8, 9, 1, 2, 3, 4, 5, 6, 7);
    PMX_Printf(0, "%.*s", -1, "any");
    PMX_Printf(0, szStrange, 1);
}

static int iPrint(const char* szFile)
{
    if (strcmp(szFile, "-") != 0 && iRecordInto(szFile) != 0)
        return 1;
    PMX_Init();
    fgPrints = TRUE;
    PMX_debug_level = 1;
    PMX_Printf(0, "%*d %s", 7, 42, "behind a width");
    PMX_Printf(0, "%.*s, %-*.*s.", 3, "three four", 6, 2, "two");
    PMX_Printf(0, "%ld%% and %5s, %%s %%d", 12345678L, "so");
    PMX_Printf(0, "%.8s %.*s.", pcOfPage("12345678"), 4, pcOfPage("1234"));
    PMX_Printf(2, pcOfPage(""), "nobody reads that");
    PMX_Printf(-1, pcOfPage(""), "nor this");
    PMX_Printf(32, pcOfPage(""), "nor this");
    vPrintLong();
    vPrintOdd();
    return 0;
}

static int iAreRefused(void)
{
    static UINT32 au4Memory[PMX_RECORDER_MEMORY(4 * PMX_RECORDER_LEAST_WORDS) / 4 + 1];
    PMX_RECORDER_SETUP_T rHow = { (UCHAR*)au4Memory + 1, sizeof au4Memory - 4, u4Time, u4Thread, 1000, FALSE };
    BOOL fgStarted = fgPmxRecorderStart(&rHow);
    rHow.pvMemory = au4Memory;
    rHow.u4Size -= 4;
    fgStarted |= fgPmxRecorderStart(&rHow);
    PMX_Init();
    vChangeModes(1);
    rHow.u4Size += 4;
    return fgStarted == FALSE && u4Events == 0 && fgPmxRecorderStart(&rHow) != FALSE ? 0 : 1;
}

int main(int iCount, char** pszWords)
{
    static UINT32 au4Memory[MEMORY_SIZE / 4];
    const PMX_RECORDER_SETUP_T rHow = { au4Memory, sizeof au4Memory, u4Time, u4Thread, 1000, FALSE };
    const UINT32 u4Number = iCount == 3 ? (UINT32)atoi(pszWords[2]) : 0;
    if (iCount != 3)
        return 2;
    if (strcmp(pszWords[1], "print") == 0)
        return iPrint(pszWords[2]);
    if (strcmp(pszWords[1], "refused") == 0)
        return iAreRefused();
    if (pszWords[1][0] == '-' || pszWords[1][0] == '+')
    {
        if (pszWords[1][0] == '+' && fgPmxRecorderStart(&rHow) == FALSE)
            return 1;
        PMX_Init();
        vChangeModes(u4Number);
        return 0;
    }
    u4LastEvent = u4Number;
    if (iRecordInto(pszWords[1]) != 0)
        return 1;
    PMX_Init();
    vChangeModes(500);
    return 0;
}
