// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The layer on several threads, under ThreadSanitizer: what the layer's mutex protects is free of races, what the layer
 * leaves unlocked is listed by name in unlocked_by_design.supp, and nothing waits for ever.
 *
 * How to run it:
 *     ctest --preset debug -R '^threads'                     all of it, as check_threads.py looks at it
 *     build/debug/layer_threads                              100,000 calls on twelve threads; every race is reported
 *     TSAN_OPTIONS=suppressions=tests/threads/unlocked_by_design.supp build/debug/layer_threads
 *                                                            only what must not be: silence, and exit code 0
 *     PMX_THREADS_NO_LOCK=1 ...                              the same without the mutex: what it protects is reported
 *     PMX_THREADS_CONNECT_INSIDE=1 ...                       a video plane breaks its contract: all wait, exit code 3
 * Options: --calls N (100000), --patience MS (20000).
 *
 * How to read a report: "data race" is followed by two stacks, the access that was just made and the one before it. The
 * functions at #0 made them. At least one of the two touched the record without the mutex; "mutexes: write M…" behind
 * an access tells that it held it. If both functions hold the mutex by contract (i4Pmx_Connect, i4Pmx_Disconnect,
 * PMX_InformVdpColorSpace), the locking is broken. If one is new and takes no lock because its contract says so, it
 * gets an entry, with the reason, in unlocked_by_design.supp. Nothing else does.
 *
 * Exit codes: 0 all well; 1 a breach, printed as such; 2 usage; 3 nothing moved for so long as the patience lasts;
 * 66 races (ThreadSanitizer's own). */
#include "drv_pmx.h"
#include "jobs.h"
#include "stand_ins.h"

#include <atomic>
#include <charconv>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <deque>
#include <thread>
#include <unistd.h>

using namespace std::chrono_literals;

namespace
{

struct Options
{
    unsigned calls = 100000;
    unsigned patience_ms = 20000;
};

/* The threads go through so many rounds side by side: none is done before another has begun, however the machine
 * schedules them, and each meets each. */
constexpr unsigned ROUNDS = 100;
constexpr unsigned LEAST_CALLS = 100 * ROUNDS; // one for each percent of a job in each round

/* One thread. What others read of it is relaxed: its progress orders nothing. */
struct Worker
{
    Worker(const Job& its_job, unsigned its_calls_a_round) : job(&its_job), calls_a_round(its_calls_a_round) {}

    const Job* job;
    unsigned calls_a_round;
    std::atomic<unsigned> done{ 0 };
    std::thread thread;
};

std::atomic<unsigned> rounds_ended; // of all threads together

void work(Worker& worker)
{
    const unsigned threads = static_cast<unsigned>(jobs().size());
    unsigned step = 0;
    for (unsigned round = 1; round <= ROUNDS; round++)
    {
        for (unsigned i = 0; i < worker.calls_a_round; i++)
        {
            worker.job->call(step++);
            worker.done.store(step, std::memory_order_relaxed);
            if (step % 16 == 0)
                std::this_thread::yield();
        }
        rounds_ended.fetch_add(1, std::memory_order_relaxed);
        while (rounds_ended.load(std::memory_order_relaxed) < round * threads)
            std::this_thread::yield();
    }
}

bool parse(int argc, char** argv, Options& options)
{
    for (int i = 1; i < argc; i += 2)
    {
        unsigned* value = std::strcmp(argv[i], "--calls") == 0      ? &options.calls
                          : std::strcmp(argv[i], "--patience") == 0 ? &options.patience_ms
                                                                    : nullptr;
        if (value == nullptr || i + 1 == argc)
            return false;
        const char* end = argv[i + 1] + std::strlen(argv[i + 1]);
        auto [rest, error] = std::from_chars(argv[i + 1], end, *value);
        if (error != std::errc() || rest != end)
            return false;
    }
    return options.calls % LEAST_CALLS == 0;
}

unsigned calls_made(const std::deque<Worker>& workers)
{
    unsigned sum = 0;
    for (const Worker& worker : workers)
        sum += worker.done.load(std::memory_order_relaxed);
    return sum;
}

/* Wait for all calls. False: for so long as the patience lasts not one was made. */
bool watch(const std::deque<Worker>& workers, const Options& options)
{
    unsigned last = 0;
    auto last_progress = std::chrono::steady_clock::now();
    while (last < options.calls)
    {
        std::this_thread::sleep_for(5ms);
        unsigned made = calls_made(workers);
        auto now = std::chrono::steady_clock::now();
        if (made != last)
        {
            last = made;
            last_progress = now;
        }
        else if (now - last_progress > std::chrono::milliseconds(options.patience_ms))
        {
            return false;
        }
    }
    return true;
}

void print_who_waits(const std::deque<Worker>& workers)
{
    std::printf("deadlock: nothing moves any more\n");
    for (const Worker& worker : workers)
    {
        unsigned done = worker.done.load(std::memory_order_relaxed);
        if (done < worker.calls_a_round * ROUNDS)
            std::printf("  %s: %u of %u calls made\n", worker.job->name, done, worker.calls_a_round * ROUNDS);
    }
    std::fflush(stdout);
}

void expect(bool holds, const char* what)
{
    if (!holds)
        stand_ins::breach(what);
}

/* What holds whatever the order was. */
void check_end()
{
    unsigned before = stand_ins::colour_modes_set();
    expect(before > 0, "no video plane was ever told a colour space");
    PMX_InformVdpColorSpace(0);
    expect(stand_ins::colour_modes_set() == before + 2, "a port is not connected as its threads left it");
    expect(stand_ins::interfaces_held() == 0, "an interface was fetched and not given back");
    PMX_Uninit();
    expect(stand_ins::objects() == 0, "a mutex or timer is left after the shut-down");
}

} // namespace

int main(int argc, char** argv)
{
    Options options;
    if (!parse(argc, argv, options))
    {
        std::fprintf(stderr, "usage: %s [--calls N] [--patience MS]   N in steps of %u\n", argv[0], LEAST_CALLS);
        return 2;
    }

    PMX_Init();
    connect_all();
    std::deque<Worker> workers;
    for (const Job& job : jobs())
        workers.emplace_back(job, options.calls / LEAST_CALLS * job.percent);
    for (Worker& worker : workers)
        worker.thread = std::thread(work, std::ref(worker));

    if (!watch(workers, options))
    {
        print_who_waits(workers);
        _exit(3); // threads that wait for ever cannot be joined
    }
    for (Worker& worker : workers)
        worker.thread.join();
    check_end();

    std::printf("%u calls on %zu threads, %u breaches\n", calls_made(workers), workers.size(), stand_ins::breaches());
    return stand_ins::breaches() == 0 ? 0 : 1;
}
