// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Interface manager: who publishes which table of functions, and how many hold it. */
#include <linux/mutex.h>

#include "drv_if.h"

#define MOST_INTERFACES 16
#define FAILED (-1)

struct published
{
    const void* table; /* NULL: nothing stands here */
    void* tag;
    UINT16 type;
    UINT16 id;
    UINT32 interface;
    unsigned int held;
};

static struct published all[MOST_INTERFACES];
static DEFINE_MUTEX(all_lock);

static struct published* find(UINT16 type, UINT16 id, UINT32 interface)
{
    struct published* one;

    for (one = all; one < all + MOST_INTERFACES; one++)
    {
        if (one->table && one->type == type && one->id == id && one->interface == interface)
            return one;
    }
    return NULL;
}

static struct published* find_free(void)
{
    struct published* one;

    for (one = all; one < all + MOST_INTERFACES; one++)
    {
        if (!one->table)
            return one;
    }
    return NULL;
}

INT32 i4ImRegisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, const void* pvIf, void* pvTag)
{
    struct published* one = NULL;

    mutex_lock(&all_lock);
    if (pvIf && !find(u2CompType, u2CompId, u4IfId))
        one = find_free();
    if (one)
    {
        *one =
            (struct published){ .table = pvIf, .tag = pvTag, .type = u2CompType, .id = u2CompId, .interface = u4IfId };
    }
    mutex_unlock(&all_lock);
    return one ? 0 : FAILED;
}

INT32 i4ImUnregisterInterface2(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId)
{
    struct published* one;

    mutex_lock(&all_lock);
    one = find(u2CompType, u2CompId, u4IfId);
    if (one)
        one->table = NULL;
    mutex_unlock(&all_lock);
    return one ? 0 : FAILED;
}

INT32 i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag)
{
    struct published* one;

    mutex_lock(&all_lock);
    one = find(u2CompType, u2CompId, u4IfId);
    if (one)
    {
        one->held++;
        *ppvIf = (void*)one->table;
        *ppvTag = one->tag;
    }
    mutex_unlock(&all_lock);
    return one ? 0 : FAILED;
}

INT32 i4ImReleaseInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void* pvTag)
{
    struct published* one;

    mutex_lock(&all_lock);
    one = find(u2CompType, u2CompId, u4IfId);
    if (one && (one->tag != pvTag || !one->held))
        one = NULL;
    if (one)
        one->held--;
    mutex_unlock(&all_lock);
    return one ? 0 : FAILED;
}
