// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Loaded before a program's libraries: a thread that gives a mutex back goes on later, now and then. Whoever relies on
 * being faster than the others is found. */
#define _GNU_SOURCE
#include <dlfcn.h>
#include <pthread.h>
#include <stdint.h>
#include <string.h>
#include <unistd.h>

#define LONGEST_US 400u

__attribute__((visibility("default"))) int pthread_mutex_unlock(pthread_mutex_t* mutex)
{
    static volatile uint32_t drawn = 1;
    int (*unlock)(pthread_mutex_t*);
    void* const found = dlsym(RTLD_NEXT, "pthread_mutex_unlock");
    int result;
    memcpy(&unlock, &found, sizeof unlock);
    result = unlock(mutex);
    /* Any order of numbers will do: threads that draw at once draw the same. */
    drawn = drawn * 1103515245u + 12345u;
    usleep((drawn >> 16) % LONGEST_US);
    return result;
}
