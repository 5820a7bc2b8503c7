// SPDX-License-Identifier: MIT OR GPL-2.0-only
// How long pictures take, beside a copy of the same bytes in the same run: of eight planes of 1920x1080 one output, and
// all four. Ends with 1 where a goal is missed.
#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "board/picture/shot.h"
#include "drv_if_pmx.h"

namespace
{

using namespace board::picture;
using Clock = std::chrono::steady_clock;

constexpr double GOAL_ONE = 12;
constexpr double GOAL_FOUR = 30;
constexpr int ROUNDS = 4;
constexpr int WIDTH = 1920;
constexpr int HEIGHT = 1080;

/** The shortest of some times, in milliseconds. */
template <typename Work>
double time_of(Work work)
{
    double shortest = 1e9;
    for (int round = 0; round < ROUNDS; ++round)
    {
        const Clock::time_point begun = Clock::now();
        work();
        shortest = std::min(shortest, std::chrono::duration<double, std::milli>(Clock::now() - begun).count());
    }
    return shortest;
}

/** What lets everything through, a little more or less from pixel to pixel: nothing can be skipped. */
std::shared_ptr<const Image> veil(unsigned seed)
{
    auto image = std::make_shared<Image>(WIDTH, HEIGHT, full_rgb);
    std::minstd_rand random(seed);
    for (Pixel& pixel : image->pixels())
    {
        const unsigned number = static_cast<unsigned>(random()) >> 8;
        const unsigned share = 64 + number % 128;
        pixel = share << 24 | (number >> 7) % share << 16 | (number >> 11) % share << 8 | (number >> 15) % share;
    }
    return image;
}

/** Eight planes that fill the picture: two of video, which both convert, and six of graphics. */
Hardware eight_planes()
{
    Hardware hardware;
    hardware.mixer.mode = RES_1080P60HZ;
    hardware.mixer.mixed.fill(true);
    hardware.mixer.selectors = { 0, 0, 2, 3, 4, 5, 6, 7 }; // the main video twice: the second one is a window
    hardware.mixer.main_converter = { true, false };
    hardware.mixer.digital_port = true;
    hardware.osd.told = Standard::Bt601;
    hardware.hdmi = hardware.digital = LinkState{ true, RES_1080P60HZ };
    hardware.encoders[0] = { true, RES_1080P60HZ, 60, false };
    hardware.encoders[1] = { true, RES_480I, 60, false };
    hardware.video_planes[0].shown = true;
    for (std::size_t i = 0; i < hardware.sources.size(); ++i)
    {
        SourceState& source = hardware.sources[i];
        source.name =
            i < video_source_count ? "vdp" + std::to_string(i) : "osd" + std::to_string(i - video_source_count);
        source.told = Standard::Bt601;
        source.delivery = Delivery{ WIDTH, HEIGHT, 0, i < video_source_count };
        if (i >= video_source_count)
            source.image = veil(static_cast<unsigned>(i));
    }
    return hardware;
}

bool is_met(const char* what, double time, double copy, double goal)
{
    std::printf("%-28s %7.1f ms, %5.1f times the copy (at most %.0f)\n", what, time, time / copy, goal);
    return time <= goal * copy;
}

} // namespace

int main()
{
    const Hardware hardware = eight_planes();
    const std::vector<Pixel> from(std::size_t{ 8 } * WIDTH * HEIGHT, 1);
    std::vector<Pixel> to(from.size(), 2);
    const double copy = time_of([&] { std::memcpy(to.data(), from.data(), from.size() * sizeof(Pixel)); });
    std::printf("%-28s %7.1f ms\n", "copy of eight planes", copy);
    bool met = true;
    for (const unsigned threads : { 1U, 0U })
    {
        const std::string with = threads == 1 ? ", one thread" : ", all cores";
        const Effort effort{ threads, 1 };
        const double one = time_of([&] { shot_of(hardware, OutputId::Hdmi, effort); });
        const double four = time_of([&] { all_shots(hardware, effort); });
        met &= is_met(("one output" + with).c_str(), one, copy, GOAL_ONE);
        met &= is_met(("four outputs" + with).c_str(), four, copy, GOAL_FOUR);
    }
    return met ? EXIT_SUCCESS : EXIT_FAILURE;
}
