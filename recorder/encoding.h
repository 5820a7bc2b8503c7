// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* How what is handed over becomes words: the recorder keeps them, a replay compares them. */
#ifndef PMX_RECORDER_ENCODING_H
#define PMX_RECORDER_ENCODING_H

#include "u_os.h"
#include "x_typedef.h"

#ifdef __cplusplus
#include <cstring>
#elif defined(__KERNEL__)
#include <linux/string.h>
#else
#include <stdbool.h>
#include <stddef.h>

void* memcpy(void* pvDest, const void* pvSource, size_t zSize); /* the kernel's */
void* memset(void* pvDest, int iValue, size_t zSize);
#endif

/* A few bytes whose number the compiler knows are no call: it is told what this copies, library or not. */
#ifdef __GNUC__
#define PMX_COPY(pvTo, pvFrom, zSize) __builtin_memcpy(pvTo, pvFrom, zSize)
#else
#define PMX_COPY(pvTo, pvFrom, zSize) memcpy(pvTo, pvFrom, zSize)
#endif

#define PMX_WORDS(Size) (((Size) + 3) / 4)
#define PMX_PRESENT 0x80000000u /* of bytes behind a pointer: it was no null pointer; how many, is added */
#define PMX_MOST_BYTES 256u     /* that are kept of what one pointer leads to */
#define PMX_MOST_TEXT 384u      /* characters of a format from outside */
#define PMX_MOST_VALUES 16u     /* that go with a format */
#define PMX_ROOM 160u           /* words in which the arguments of an event are gathered */

/* Where the caller's variables stand: behind this, in so many bytes. */
#define PMX_CALLER 4096u
#ifdef __GNUC__
#define PMX_FRAME(pvLocal) __builtin_frame_address(0)
#else
#define PMX_FRAME(pvLocal) (pvLocal)
#endif

/* The layer's private variables are named here and nowhere else. Another compiler leaves that to who links. */
#ifdef __GNUC__
#define PMX_HIDDEN __attribute__((visibility("hidden")))
#else
#define PMX_HIDDEN
#endif

/* What is to be known of a format: how many values it takes, and above that a bit for each that is a text. */
#define PMX_CODE_COUNT(u4Code) ((u4Code)&31u)
#define PMX_CODE_TEXTS(u4Code) ((u4Code) >> 5 & 0xFFFFu)
#define PMX_UNRECORDED 0x80000000u /* beside that: nothing is recorded */

/* The numbers of what both sides know by name. */
#define PMX_SYMBOL_NULL 0u
#define PMX_SYMBOL_ISR 1u
#define PMX_SYMBOL_TABLE 2u
#define PMX_SYMBOL_POWER 3u
#define PMX_SYMBOL_OTHER 4u

static inline UINT32 u4PmxSize(size_t zSize, size_t zMost)
{
    return (UINT32)(zSize < zMost ? zSize : zMost);
}

static inline UINT32 u4PmxLength(const char* szText, UINT32 u4Most)
{
    UINT32 u4Length = 0;
    while (u4Length < u4Most && szText[u4Length] != 0)
        ++u4Length;
    return u4Length;
}

/* A text of the layer, or one that it got back: its check sum (FNV-1a); 0 for a null pointer. */
static inline UINT32 u4PmxText(const char* szText)
{
    UINT32 u4Sum = 2166136261u;
    if (szText == 0)
        return 0;
    for (; *szText != 0; ++szText)
        u4Sum = (u4Sum ^ (UCHAR)*szText) * 16777619u;
    return u4Sum;
}

/* Bytes, the last word filled up with zeros. */
static inline UINT32 u4PmxPutRaw(UINT32* pu4Words, UINT32 u4At, const void* pvBytes, UINT32 u4Size)
{
    if (u4Size == 0)
        return u4At;
    pu4Words[u4At + PMX_WORDS(u4Size) - 1] = 0;
    PMX_COPY(pu4Words + u4At, pvBytes, u4Size);
    return u4At + PMX_WORDS(u4Size);
}

/* What a pointer leads to: how much, and then the bytes. */
static inline UINT32 u4PmxPutBytes(UINT32* pu4Words, UINT32 u4At, const void* pvBytes, size_t zSize)
{
    UINT32 u4Size = u4PmxSize(zSize, PMX_MOST_BYTES);
    if (pvBytes == 0)
    {
        pu4Words[u4At] = 0;
        return u4At + 1;
    }
    if (u4At + 1 + PMX_WORDS(u4Size) > PMX_ROOM - 1)
        u4Size = 0;
    pu4Words[u4At] = PMX_PRESENT | u4Size;
    return u4PmxPutRaw(pu4Words, u4At + 1, pvBytes, u4Size);
}

/* The next value that a format takes, behind its letters: 's' for a text, 'd' for anything else, 0 for none. Behind a
 * width that is a value what it is the width of still goes on. */
static inline char cPmxNextValue(const char** pszFormat, bool* pfgInside)
{
    const char* szAt = *pszFormat;
    char cFound = 0;
    for (; *szAt != 0 && cFound == 0; ++szAt)
    {
        const char c = *szAt;
        if (!*pfgInside)
            *pfgInside = c == '%';
        else if (c == '%')
            *pfgInside = false;
        else if (c == 's')
            cFound = 's';
        else if (c == '*' || (c >= 'a' && c <= 'z' && c != 'h' && c != 'l' && c != 'z') || (c >= 'A' && c <= 'Z'))
            cFound = 'd';
        if (cFound != 0)
            *pfgInside = c == '*';
    }
    *pszFormat = szAt;
    return cFound;
}

/* The PMX_CODE_ of a format. */
static inline UINT32 u4PmxCode(const char* szFormat)
{
    UINT32 u4Count = 0;
    UINT32 u4Texts = 0;
    bool fgInside = false;
    char c;
    if (szFormat == 0)
        return 0;
    while (u4Count < PMX_MOST_VALUES && (c = cPmxNextValue(&szFormat, &fgInside)) != 0)
        u4Texts |= (c == 's' ? 1u : 0u) << u4Count++;
    return u4Texts << 5 | u4Count;
}

/* All values of a format, wide enough to be handed on. Wherever int, long and pointers are passed alike each is read as
 * the widest. */
static inline void vPmxCollect(UINT32 u4Code, va_list rArgs, long* piValues)
{
    UINT32 i;
    for (i = 0; i < PMX_CODE_COUNT(u4Code); ++i)
        piValues[i] = va_arg(rArgs, long);
}

/* The layer prints what it has made on the stack as a format once more, without values: what would be taken for them is
 * another thing each time, and no text. The formats of its own that it prints so have numbers alone. */
static inline UINT32 u4PmxNumbersAlone(UINT32 u4Code, const char* szFormat, const void* pvFrame)
{
    return (size_t)szFormat - (size_t)pvFrame < PMX_CALLER ? 0 : PMX_CODE_COUNT(u4Code);
}

/* The same as words. A text from outside is kept whole, one of the layer as its check sum. */
static inline UINT32 u4PmxPutValues(UINT32* pu4Words, UINT32 u4At, UINT32 u4Code, const long* piValues, bool fgWhole)
{
    UINT32 i;
    for (i = 0; i < PMX_CODE_COUNT(u4Code); ++i)
    {
        const char* const szText = (const char*)(size_t)piValues[i];
        if (u4At + 2 >= PMX_ROOM)
            return u4At;
        if ((PMX_CODE_TEXTS(u4Code) >> i & 1) == 0)
            pu4Words[u4At++] = (UINT32)piValues[i];
        else if (fgWhole)
            u4At = u4PmxPutBytes(pu4Words, u4At, szText, szText == 0 ? 0 : u4PmxLength(szText, 63));
        else
            pu4Words[u4At++] = u4PmxText(szText);
    }
    return u4At;
}

#endif
