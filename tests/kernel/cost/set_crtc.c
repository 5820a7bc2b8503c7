// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A mode change of the kernel's own display drivers, by the plain system call, for comparison. Prints nanoseconds. */
#include <drm/drm.h>
#include <drm/drm_mode.h>
#include <fcntl.h>
#include <stdint.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/ioctl.h>
#include <time.h>

#define MOST 64
#define MOST_MODES 128
#define WARM_UP 4
#define ROUNDS 101

static void fail(const char* what)
{
    perror(what);
    exit(1);
}

static uint64_t now(void)
{
    struct timespec time;

    clock_gettime(CLOCK_MONOTONIC, &time);
    return time.tv_sec * 1000000000ull + time.tv_nsec;
}

static int by_size(const void* one, const void* other)
{
    uint64_t first = *(const uint64_t*)one, second = *(const uint64_t*)other;

    return first < second ? -1 : first > second;
}

static uint32_t buffer(int card, const struct drm_mode_modeinfo* mode)
{
    struct drm_mode_create_dumb memory = { .width = mode->hdisplay, .height = mode->vdisplay, .bpp = 32 };
    struct drm_mode_fb_cmd made = { .width = mode->hdisplay, .height = mode->vdisplay, .bpp = 32, .depth = 24 };

    if (ioctl(card, DRM_IOCTL_MODE_CREATE_DUMB, &memory))
        fail("no memory to show");
    made.pitch = memory.pitch;
    made.handle = memory.handle;
    if (ioctl(card, DRM_IOCTL_MODE_ADDFB, &made))
        fail("no buffer to show");
    return made.fb_id;
}

static const struct drm_mode_modeinfo* find(const struct drm_mode_modeinfo* modes, unsigned num, int width, int height)
{
    for (unsigned i = 0; i < num; i++)
    {
        if (modes[i].hdisplay == width && modes[i].vdisplay == height)
            return &modes[i];
    }
    fprintf(stderr, "no mode of %d by %d\n", width, height);
    exit(1);
}

static uint64_t set(int card, uint32_t crtc, uint32_t* connector, const struct drm_mode_modeinfo* mode, uint32_t shown)
{
    struct drm_mode_crtc request = { .set_connectors_ptr = (uintptr_t)connector,
                                     .count_connectors = 1,
                                     .crtc_id = crtc,
                                     .mode_valid = 1,
                                     .fb_id = shown,
                                     .mode = *mode };
    uint64_t begun = now();

    if (ioctl(card, DRM_IOCTL_MODE_SETCRTC, &request))
        fail("no other mode");
    return now() - begun;
}

int main(void)
{
    static struct drm_mode_modeinfo modes[MOST_MODES];
    static uint32_t crtcs[MOST], connectors[MOST], properties[MOST], encoders[MOST];
    static uint64_t values[MOST], took[ROUNDS];
    struct drm_mode_card_res all = { .crtc_id_ptr = (uintptr_t)crtcs,
                                     .connector_id_ptr = (uintptr_t)connectors,
                                     .count_crtcs = MOST,
                                     .count_connectors = MOST };
    struct drm_mode_get_connector connector = { .connector_id = 0 };
    int card = open("/dev/dri/card0", O_RDWR);

    if (card < 0 || ioctl(card, DRM_IOCTL_MODE_GETRESOURCES, &all))
        fail("/dev/dri/card0");
    connector.connector_id = connectors[0];
    if (ioctl(card, DRM_IOCTL_MODE_GETCONNECTOR, &connector))
        fail("no connector");
    connector.modes_ptr = (uintptr_t)modes;
    connector.props_ptr = (uintptr_t)properties;
    connector.prop_values_ptr = (uintptr_t)values;
    connector.encoders_ptr = (uintptr_t)encoders;
    if (connector.count_modes > MOST_MODES || ioctl(card, DRM_IOCTL_MODE_GETCONNECTOR, &connector))
        fail("no modes");
    const struct drm_mode_modeinfo* wanted[] = { find(modes, connector.count_modes, 1024, 768),
                                                 find(modes, connector.count_modes, 800, 600) };
    uint32_t shown[] = { buffer(card, wanted[0]), buffer(card, wanted[1]) };
    for (int i = 0; i < WARM_UP + ROUNDS; i++)
    {
        uint64_t one = set(card, crtcs[0], connectors, wanted[i % 2], shown[i % 2]);

        if (i >= WARM_UP)
            took[i - WARM_UP] = one;
    }
    qsort(took, ROUNDS, sizeof(*took), by_size);
    printf("COST bochs mode %llu 1\n", (unsigned long long)took[ROUNDS / 2]);
    return 0;
}
