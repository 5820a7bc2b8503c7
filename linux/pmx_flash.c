// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Flash: the kernel's MTD devices, by their names. */
#include <linux/err.h>
#include <linux/mtd/mtd.h>

#include "u_os.h"

INT32 get_part_id_by_name(const CHAR* szName)
{
    struct mtd_info* device = get_mtd_device_nm(szName);
    INT32 id;

    if (IS_ERR(device))
        return -1;
    id = device->index;
    put_mtd_device(device);
    return id;
}

/* The range is looked at before the read: a read that MTD breaks off has written to the destination. */
INT32 i4NFBPartitionRead(INT32 i4PartId, UINT32 u4Offset, void* pvDest, UINT32 u4Count)
{
    struct mtd_info* device;
    size_t done = 0;
    int result = -ENODEV;

    if (i4PartId < 0)
        return -1;
    device = get_mtd_device(NULL, i4PartId);
    if (IS_ERR(device))
        return -1;
    if (u4Offset <= device->size && u4Count <= device->size - u4Offset)
        result = mtd_read(device, u4Offset, u4Count, &done, pvDest);
    if (mtd_is_bitflip(result)) /* and mended */
        result = 0;
    put_mtd_device(device);
    return result || done != u4Count ? -1 : (INT32)done;
}
