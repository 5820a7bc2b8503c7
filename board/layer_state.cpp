// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/layer_state.h"

#include <cstring>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "board/executable_symbols.h"

namespace board::layer_state
{
namespace
{

constexpr std::string_view objects[] = { "_arPmxConf",  "bComp0OnTop",   "_arPmxDispPartStatus",
                                         "MutexPMX",    "_PmxInitiated", "_fg2DCap",
                                         "_PmxTestOsd", "_fgBootUp",     "PMX_debug_level" };

struct Image
{
    executable_symbols::Symbol object;
    std::vector<unsigned char> content;
};

struct Load
{
    std::vector<Image> images;
    std::string error; ///< told at power-on: nobody listens before main begins
};

Load take()
try
{
    Load load;
    std::string missing;
    for (const std::string_view name : objects)
    {
        const auto object = executable_symbols::find(name);
        if (!object)
        {
            missing += (missing.empty() ? "" : ", ") + std::string(name);
            continue;
        }
        const auto* const first = static_cast<const unsigned char*>(object->address);
        load.images.push_back({ *object, { first, first + object->size } });
    }
    if (!load.images.empty() && !missing.empty())
        load.error = "the layer in this executable lacks " + missing;
    return load;
}
catch (const std::exception& exception)
{
    return { {}, exception.what() };
}

// The layer has no code that runs before main, so whenever this runs its objects are as loaded.
const Load as_loaded = take();

} // namespace

void restore()
{
    if (!as_loaded.error.empty())
        throw std::runtime_error(as_loaded.error);
    for (const Image& image : as_loaded.images)
        std::memcpy(image.object.address, image.content.data(), image.content.size());
}

} // namespace board::layer_state
