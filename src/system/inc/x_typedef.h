// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Basic types of the driver stack. Widths are the contract: every header of the stack builds on them, in C and in
 *  C++. */
#ifndef X_TYPEDEF_H
#define X_TYPEDEF_H

#if defined(__KERNEL__) && !defined(__cplusplus)
#include <linux/types.h>
#else
#include <stddef.h>
#endif

#ifdef __cplusplus
#define DRV_STATIC_ASSERT(Expression, Text) static_assert(Expression, Text)
#else
#define DRV_STATIC_ASSERT(Expression, Text) _Static_assert(Expression, Text)
#endif

/** Declares an enumeration that is 32 bits wide on every tool chain and, in C++, may hold any 32-bit value: a number
 *  that a C caller hands over without a name for it is ordinary data. C files are compiled with -fno-short-enums. */
#ifdef __cplusplus
#define DRV_ENUM(Name) enum Name : UINT32
#define DRV_ENUM_UNNAMED enum : UINT32
#else
#define DRV_ENUM(Name) enum Name
#define DRV_ENUM_UNNAMED enum
#endif

/** Lets the compiler check a printf-like function: the format's and the first value's position, counted from 1. */
#define DRV_PRINTF_FORMAT(Format, Values) __attribute__((format(printf, Format, Values)))

typedef char CHAR;
typedef unsigned char UCHAR;
typedef unsigned char UINT8;
typedef unsigned char BYTE;
typedef unsigned char BOOL; /**< TRUE or FALSE */
typedef signed char INT8;
typedef unsigned short UINT16;
typedef int INT32;
typedef unsigned int UINT32;
typedef unsigned int HANDLE_T; /**< names an object of the operating-system layer; 0 names none */

#ifndef TRUE
#define TRUE 1
#endif
#ifndef FALSE
#define FALSE 0
#endif

DRV_STATIC_ASSERT(sizeof(CHAR) == 1, "CHAR is 8 bits wide");
DRV_STATIC_ASSERT(sizeof(UCHAR) == 1 && (UCHAR)-1 > 0, "UCHAR is unsigned, 8 bits wide");
DRV_STATIC_ASSERT(sizeof(UINT8) == 1 && (UINT8)-1 > 0, "UINT8 is unsigned, 8 bits wide");
DRV_STATIC_ASSERT(sizeof(BYTE) == 1 && (BYTE)-1 > 0, "BYTE is unsigned, 8 bits wide");
DRV_STATIC_ASSERT(sizeof(BOOL) == 1 && (BOOL)-1 > 0, "BOOL is unsigned, 8 bits wide");
DRV_STATIC_ASSERT(sizeof(INT8) == 1 && (INT8)-1 < 0, "INT8 is signed, 8 bits wide");
DRV_STATIC_ASSERT(sizeof(UINT16) == 2 && (UINT16)-1 > 0, "UINT16 is unsigned, 16 bits wide");
DRV_STATIC_ASSERT(sizeof(INT32) == 4 && (INT32)-1 < 0, "INT32 is signed, 32 bits wide");
DRV_STATIC_ASSERT(sizeof(UINT32) == 4 && (UINT32)-1 > 0, "UINT32 is unsigned, 32 bits wide");
DRV_STATIC_ASSERT(sizeof(HANDLE_T) == 4 && (HANDLE_T)-1 > 0, "HANDLE_T is unsigned, 32 bits wide");

#endif
