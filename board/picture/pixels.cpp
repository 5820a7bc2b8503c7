// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/pixels.h"

#include <pixman.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <exception>
#include <memory>
#include <mutex>
#include <new>
#include <system_error>
#include <thread>

namespace board::picture
{
namespace
{

struct Unreference
{
    void operator()(pixman_image_t* image) const { pixman_image_unref(image); }
};
using PixmanImage = std::unique_ptr<pixman_image_t, Unreference>;

/** pixman looks at pixels that are sources, and does not change them. */
PixmanImage bits_of(const Pixel* pixels, int pitch, int width, int height)
{
    PixmanImage image(pixman_image_create_bits(PIXMAN_a8r8g8b8, width, height, const_cast<Pixel*>(pixels),
                                               pitch * static_cast<int>(sizeof(Pixel))));
    if (image == nullptr)
        throw std::bad_alloc();
    return image;
}

/** Each pixel of a smaller picture is the mean of those that it covers; those of a larger one lie between. */
void choose_filter(pixman_image_t* image, double across, double down)
{
    if (across <= 1 && down <= 1)
    {
        pixman_image_set_filter(image, PIXMAN_FILTER_BILINEAR, nullptr, 0);
        return;
    }
    int count = 0;
    const std::unique_ptr<pixman_fixed_t, void (*)(void*)> parameters(
        pixman_filter_create_separable_convolution(&count, pixman_double_to_fixed(std::max(across, 1.0)),
                                                   pixman_double_to_fixed(std::max(down, 1.0)), PIXMAN_KERNEL_LINEAR,
                                                   PIXMAN_KERNEL_LINEAR, PIXMAN_KERNEL_BOX, PIXMAN_KERNEL_BOX, 3, 3),
        std::free);
    if (parameters == nullptr)
        throw std::bad_alloc();
    pixman_image_set_filter(image, PIXMAN_FILTER_SEPARABLE_CONVOLUTION, parameters.get(), count);
}

/** A thread that has not some bands to do takes longer to begin than to end. */
unsigned thread_count(int height, unsigned wanted)
{
    const auto most = static_cast<unsigned>(height / (4 * rows_in_band));
    return std::clamp(wanted != 0 ? wanted : std::thread::hardware_concurrency(), 1U, std::max(most, 1U));
}

} // namespace

Image scaled(const Image& image, const Box& part, int width, int height, unsigned threads)
{
    // The shares of pixels that make one have 16 bits: of too many each would be nothing. They go by several steps.
    constexpr int most = 16;
    if (width > 0 && height > 0 && (part.width > most * width || part.height > most * height))
    {
        const int across = std::max(width, (part.width + most - 1) / most);
        const int down = std::max(height, (part.height + most - 1) / most);
        return scaled(scaled(image, part, across, down, threads), width, height, threads);
    }
    Image result(width, height, image.space());
    result.set_opaque(image.is_opaque());
    const double across = static_cast<double>(part.width) / width;
    const double down = static_cast<double>(part.height) / height;
    in_bands(height, threads, [&](int from, int to) {
        const PixmanImage source = bits_of(image.pixels().data(), image.width(), image.width(), image.height());
        pixman_transform_t transform;
        pixman_transform_init_scale(&transform, pixman_double_to_fixed(across), pixman_double_to_fixed(down));
        pixman_transform_translate(&transform, nullptr, pixman_int_to_fixed(part.x), pixman_int_to_fixed(part.y));
        pixman_image_set_transform(source.get(), &transform);
        pixman_image_set_repeat(source.get(), PIXMAN_REPEAT_PAD);
        choose_filter(source.get(), across, down);
        const PixmanImage target = bits_of(result.row(from).data(), width, width, to - from);
        pixman_image_composite32(PIXMAN_OP_SRC, source.get(), nullptr, target.get(), 0, from, 0, 0, 0, 0, width,
                                 to - from);
    });
    return result;
}

Image scaled(const Image& image, int width, int height, unsigned threads)
{
    return scaled(image, { 0, 0, image.width(), image.height() }, width, height, threads);
}

void lay_over(const Pixel* above, int above_pitch, Pixel* below, int below_pitch, int width, int height)
{
    const PixmanImage source = bits_of(above, above_pitch, width, height);
    const PixmanImage target = bits_of(below, below_pitch, width, height);
    pixman_image_composite32(PIXMAN_OP_OVER, source.get(), nullptr, target.get(), 0, 0, 0, 0, 0, 0, width, height);
}

void in_bands(int height, unsigned threads, const std::function<void(int from, int to)>& work)
{
    std::atomic<int> next = 0;
    std::exception_ptr failure;
    std::mutex failed;
    const auto take_bands = [&] {
        try
        {
            for (int from = next.fetch_add(rows_in_band); from < height; from = next.fetch_add(rows_in_band))
                work(from, std::min(from + rows_in_band, height));
        }
        catch (...)
        {
            const std::lock_guard lock(failed);
            failure = std::current_exception();
        }
    };
    std::vector<std::thread> others;
    try
    {
        others.reserve(thread_count(height, threads) - 1);
        while (others.size() < others.capacity())
            others.emplace_back(take_bands);
    }
    catch (const std::system_error&)
    {
        // A machine that has no more threads does with those that there are.
    }
    take_bands();
    for (std::thread& other : others)
        other.join();
    if (failure)
        std::rethrow_exception(failure);
}

} // namespace board::picture
