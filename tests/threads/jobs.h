// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* What each thread does. */
#ifndef TESTS_THREADS_JOBS_H
#define TESTS_THREADS_JOBS_H

#include <span>

struct Job
{
    const char* name;
    unsigned percent;            // of all calls
    void (*call)(unsigned step); // one call into the layer: the step-th of this thread
};

std::span<const Job> jobs();

/* Every source connected: how each thread finds the ports, and how those that connect leave them. */
void connect_all();

#endif
