// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/layer_state.h"

#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
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
    std::string_view name;
    executable_symbols::Symbol object;
    std::vector<unsigned char> content;
};

struct Load
{
    std::vector<Image> images;
    std::string error; ///< told at power-on: nobody listens before main begins
};

/** Sizes are those of the symbol table. A checked build pads objects there with bytes that nobody may touch, which go
 *  back as they were; so they are copied byte by byte, unchecked. */
#if defined(__clang__) || defined(__GNUC__)
__attribute__((no_sanitize("address")))
#endif
void copy_unchecked(volatile unsigned char* to, const volatile unsigned char* from, std::size_t size)
{
    for (std::size_t i = 0; i < size; ++i)
        to[i] = from[i];
}

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
        std::vector<unsigned char> content(object->size);
        copy_unchecked(content.data(), static_cast<const unsigned char*>(object->address), object->size);
        load.images.push_back({ name, *object, std::move(content) });
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
    {
        void* const object =
            executable_symbols::prefers() ? executable_symbols::find(image.name)->address : image.object.address;
        copy_unchecked(static_cast<unsigned char*>(object), image.content.data(), image.content.size());
    }
}

} // namespace board::layer_state
