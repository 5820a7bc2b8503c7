// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/compare.h"

#include <algorithm>
#include <cstdlib>

namespace board::picture
{

unsigned distance(Pixel one, Pixel other)
{
    unsigned most = 0;
    for (unsigned index = 0; index < 3; ++index)
    {
        const int apart = static_cast<int>(code(one, index)) - static_cast<int>(code(other, index));
        most = std::max(most, static_cast<unsigned>(std::abs(apart)));
    }
    return most;
}

std::optional<Difference> difference(const Image& one, const Image& other, unsigned tolerance)
{
    Difference found;
    found.shown = Image(one.width(), one.height());
    found.shown.set_opaque(true);
    for (int y = 0; y < one.height(); ++y)
    {
        for (int x = 0; x < one.width(); ++x)
        {
            const unsigned apart = distance(one.at(x, y), other.at(x, y));
            const unsigned light = apart > tolerance ? std::min(96 + apart, 255U) : 0;
            found.shown.at(x, y) = apart > tolerance ? opaque(light, light, 0) : opaque(0, 0, 32);
            found.pixels += apart > tolerance ? 1 : 0;
            if (apart > found.most)
            {
                found.most = apart;
                found.x = x;
                found.y = y;
            }
        }
    }
    return found.pixels == 0 ? std::nullopt : std::optional(std::move(found));
}

} // namespace board::picture
