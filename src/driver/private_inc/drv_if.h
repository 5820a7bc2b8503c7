// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Interface manager: where a driver publishes its table of functions and others fetch it.
 *  An interface is named by its component's type and id and by an interface id. Negative results are failures. */
#ifndef DRV_IF_H
#define DRV_IF_H

#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

#define IID_IVdp 6 /**< a video plane's IVdp table */
#define IID_IPMX 9 /**< the mixer's IPMX table */

/** Publish an interface.
 *  @param     u2CompType  component type, a PMX_COMP_TYPE_ value
 *  @param     u2CompId    component id
 *  @param     u4IfId      interface id, an IID_ value
 *  @param[in] pvIf        [symbol] the table; stays where it is until it is unregistered
 *  @param[in] pvTag       [tag] handed to every function of the table as its first argument
 *  @return 0 or above; negative on a failure
 *  @context a thread that may sleep */
INT32 i4ImRegisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, const void* pvIf, void* pvTag);

/** Withdraw an interface.
 *  @param u2CompType  component type, a PMX_COMP_TYPE_ value
 *  @param u2CompId    component id
 *  @param u4IfId      interface id, an IID_ value
 *  @return 0 or above; negative on a failure, for instance when it is not registered
 *  @context a thread that may sleep */
INT32 i4ImUnregisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId);

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
INT32 i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag);

/** Give a fetched interface back, once for each successful query.
 *  @param     u2CompType  component type, a PMX_COMP_TYPE_ value
 *  @param     u2CompId    component id
 *  @param     u4IfId      interface id, an IID_ value
 *  @param[in] pvTag       [tag] the tag that the query yielded
 *  @return 0 or above; negative on a failure
 *  @context a thread that may sleep; the mixer holds MutexPMX */
INT32 i4ImReleaseInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void* pvTag);

#ifdef __cplusplus
}
#endif

#endif
