# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The machines whose kernels run the port: what Debian calls them, what compiles for them, and what emulates them."""

import dataclasses


@dataclasses.dataclass(frozen=True)
class Machine:
    architecture: str  # of Debian's packages
    flavour: str       # of Debian's kernels
    arch: str          # as the kernel's build calls it
    cross: str         # what the names of its compiler and binutils begin with
    image: str         # what an own kernel's build makes to boot from
    console: str
    emulator: tuple
    modules: tuple = ()  # of Debian's stable kernel, which the port needs and that kernel does not have built in
    peers: tuple = ()    # of the same, in this order: a display driver to compare with


ARM = Machine(architecture="armhf", flavour="armmp", arch="arm", cross="arm-linux-gnueabihf-",
              image="arch/arm/boot/zImage", console="ttyAMA0",
              emulator=("qemu-system-arm", "-M", "virt,highmem=off", "-cpu", "cortex-a15"),
              peers=tuple(f"drivers/gpu/drm/{name}.ko" for name in (
                  "drm", "drm_kms_helper", "ttm/ttm", "drm_ttm_helper", "drm_vram_helper", "tiny/bochs")))
PC = Machine(architecture="amd64", flavour="amd64", arch="x86_64", cross="x86_64-linux-gnu-",
             image="arch/x86/boot/bzImage", console="ttyS0",
             emulator=("qemu-system-x86_64", "-M", "q35", "-cpu", "qemu64"), modules=("drivers/mtd/mtd.ko",))
