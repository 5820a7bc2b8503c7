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
#define PMX_CUT 0x40000000u     /* beside that, of a text: there was more of it, or nobody has read it */
#define PMX_KEPT(u4Present) ((u4Present)&0x3FFFFFFFu)
#define PMX_MOST_BYTES 256u /* that are kept of what one pointer leads to */
#define PMX_MOST_TEXT 511u  /* characters of a text from outside: what PMX_Printf prints at most */
#define PMX_MOST_VALUES 16u /* that go with a format */
#define PMX_MOST_KEPT 240u  /* words of a format from outside with its values: there are others in the event */

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

/* FNV-1a */
#define PMX_SUM_OF_NOTHING 2166136261u
#define PMX_SUM_WITH(u4Sum, cNext) (((u4Sum) ^ (UCHAR)(cNext)) * 16777619u)

/* A text of the layer, or one that it got back: its check sum; 0 for a null pointer. */
static inline UINT32 u4PmxText(const char* szText)
{
    UINT32 u4Sum = PMX_SUM_OF_NOTHING;
    if (szText == 0)
        return 0;
    for (; *szText != 0; ++szText)
        u4Sum = PMX_SUM_WITH(u4Sum, *szText);
    return u4Sum;
}

/* A text from outside: that of its first so many characters. */
static inline UINT32 u4PmxBeginning(const char* szText, UINT32 u4Length)
{
    UINT32 u4Sum = PMX_SUM_OF_NOTHING;
    UINT32 i;
    if (szText == 0)
        return 0;
    for (i = 0; i < u4Length; ++i)
        u4Sum = PMX_SUM_WITH(u4Sum, szText[i]);
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
    pu4Words[u4At] = PMX_PRESENT | u4Size;
    return u4PmxPutRaw(pu4Words, u4At + 1, pvBytes, u4Size);
}

/* How far a format is read. */
typedef struct
{
    const char* szAt;
    UINT32 u4Left;      /* characters */
    bool fgInside;      /* a conversion has begun */
    bool fgPoint;       /* and so has its precision */
    UINT32 u4Precision; /* characters that it has of a text at most */
} PMX_FORMAT_T;

static inline void vPmxRead(PMX_FORMAT_T* prFormat, const char* szFormat, UINT32 u4Length)
{
    prFormat->szAt = szFormat;
    prFormat->u4Left = szFormat == 0 ? 0 : u4Length;
    prFormat->fgInside = false;
    prFormat->fgPoint = false;
    prFormat->u4Precision = 0;
}

/* A character within a conversion that is no value yet. */
static inline void vPmxReadInside(PMX_FORMAT_T* prFormat, char c)
{
    if (c == '%')
        prFormat->fgInside = false;
    else if (c == '.')
    {
        prFormat->fgPoint = true;
        prFormat->u4Precision = 0;
    }
    else if (prFormat->fgPoint && c >= '0' && c <= '9' && prFormat->u4Precision <= PMX_MOST_TEXT)
        prFormat->u4Precision = 10 * prFormat->u4Precision + (UINT32)(c - '0');
}

/* The next value that a format takes, behind its letters: 's' for a text, '.' for a precision, 'd' for anything else, 0
 * for none. Behind a width or a precision that is a value what it belongs to still goes on. */
static inline char cPmxNextValue(PMX_FORMAT_T* prFormat)
{
    char cFound = 0;
    for (; prFormat->u4Left != 0 && *prFormat->szAt != 0 && cFound == 0; ++prFormat->szAt, --prFormat->u4Left)
    {
        const char c = *prFormat->szAt;
        if (!prFormat->fgInside)
        {
            if (c != '%')
                continue;
            prFormat->fgInside = true;
            prFormat->fgPoint = false;
            prFormat->u4Precision = ~0u;
        }
        else if (c == 's')
            cFound = 's';
        else if (c == '*')
            cFound = prFormat->fgPoint ? '.' : 'd';
        else if ((c >= 'a' && c <= 'z' && c != 'h' && c != 'l' && c != 'z') || (c >= 'A' && c <= 'Z'))
            cFound = 'd';
        else
            vPmxReadInside(prFormat, c);
        if (cFound != 0)
            prFormat->fgInside = c == '*';
    }
    return cFound;
}

/* The PMX_CODE_ of a format. */
static inline UINT32 u4PmxCode(const char* szFormat)
{
    UINT32 u4Count = 0;
    UINT32 u4Texts = 0;
    PMX_FORMAT_T rFormat;
    char c;
    vPmxRead(&rFormat, szFormat, ~0u);
    while (u4Count < PMX_MOST_VALUES && (c = cPmxNextValue(&rFormat)) != 0)
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

/* The values of a format of the layer as words. */
static inline UINT32 u4PmxPutValues(UINT32* pu4Words, UINT32 u4At, UINT32 u4Code, const long* piValues)
{
    UINT32 i;
    for (i = 0; i < PMX_CODE_COUNT(u4Code); ++i)
        pu4Words[u4At++] =
            (PMX_CODE_TEXTS(u4Code) >> i & 1) == 0 ? (UINT32)piValues[i] : u4PmxText((const char*)(size_t)piValues[i]);
    return u4At;
}

/* What is kept of a format from outside, and of the values that go with it: the operation has these characters, the
 * call that it makes with them their check sums. What a replay hands over has lost the rest, and comes to the same. */
typedef struct
{
    UINT32 u4Format;                  /* PMX_PRESENT, PMX_CUT, and how many characters; 0 for a null pointer */
    UINT32 u4Count;                   /* values */
    UINT32 u4Texts;                   /* a bit for each that is a text */
    UINT32 au4Value[PMX_MOST_VALUES]; /* the number; of a text what u4Format has of the format */
    UINT32 u4Words;                   /* of all of it, with the characters */
} PMX_KEPT_T;

/* Of a text: no more than is read of it, and than there is room for. */
static inline UINT32 u4PmxKeepText(const char* szText, UINT32 u4Precision, UINT32* pu4Room)
{
    const UINT32 u4Most = u4PmxSize(4 * *pu4Room, PMX_MOST_TEXT);
    UINT32 u4Length;
    if (szText == 0)
        return 0;
    u4Length = u4PmxLength(szText, u4PmxSize(u4Precision, u4Most));
    *pu4Room -= PMX_WORDS(u4Length);
    if (u4Length == u4Most && u4Length < u4Precision && szText[u4Length] != 0)
        return PMX_PRESENT | PMX_CUT | u4Length;
    return PMX_PRESENT | u4Length;
}

/* A precision below 0 is none in one library and 0 in another: nothing is read then. */
static inline void vPmxKeep(PMX_KEPT_T* prKept, const char* szFormat, const long* piValues)
{
    UINT32 u4Room = PMX_MOST_KEPT - 1 - PMX_MOST_VALUES;
    UINT32 u4Count = 0;
    PMX_FORMAT_T rFormat;
    char c;
    prKept->u4Texts = 0;
    prKept->u4Format = u4PmxKeepText(szFormat, ~0u, &u4Room);
    vPmxRead(&rFormat, szFormat, PMX_KEPT(prKept->u4Format));
    while (u4Count < PMX_MOST_VALUES && (c = cPmxNextValue(&rFormat)) != 0)
    {
        const long iValue = piValues[u4Count];
        prKept->au4Value[u4Count] = (UINT32)iValue;
        if (c == '.')
            rFormat.u4Precision = (INT32)iValue < 0 ? 0 : (UINT32)iValue;
        else if (c == 's')
        {
            prKept->u4Texts |= 1u << u4Count;
            prKept->au4Value[u4Count] = u4PmxKeepText((const char*)(size_t)iValue, rFormat.u4Precision, &u4Room);
        }
        ++u4Count;
    }
    prKept->u4Count = u4Count;
    prKept->u4Words = PMX_MOST_KEPT - PMX_MOST_VALUES + u4Count - u4Room;
}

static inline bool fgPmxIsText(const PMX_KEPT_T* prKept, UINT32 u4Value)
{
    return (prKept->u4Texts >> u4Value & 1) != 0;
}

/* The values as words, a text as its check sum. */
static inline UINT32 u4PmxPutSums(UINT32* pu4Words, UINT32 u4At, const PMX_KEPT_T* prKept, const long* piValues)
{
    UINT32 i;
    for (i = 0; i < prKept->u4Count; ++i)
        pu4Words[u4At++] = fgPmxIsText(prKept, i)
                               ? u4PmxBeginning((const char*)(size_t)piValues[i], PMX_KEPT(prKept->au4Value[i]))
                               : prKept->au4Value[i];
    return u4At;
}

#endif
