// SPDX-License-Identifier: MIT OR GPL-2.0-only
// clang's AddressSanitizer counts the bytes that it puts behind a global object among those of its symbol. Nobody may
// touch them, and what the board puts back at power-on goes by the symbol's size.
#include <cstddef>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <string_view>

#include "board/executable_symbols.h"
#include "board/layer_state.h"

extern "C" {
unsigned char _arPmxConf[456] = { 1, 2, 3 };
unsigned char _arPmxDispPartStatus[8];
unsigned bComp0OnTop = 4;
unsigned MutexPMX;
unsigned PMX_debug_level = 5;
unsigned char _PmxInitiated, _fg2DCap, _PmxTestOsd;
unsigned char _fgBootUp = 1;
}

namespace
{

struct Object
{
    std::string_view name;
    void* address;
    std::size_t size;
};

#define OBJECT(object)                   \
    {                                    \
#object, &object, sizeof(object) \
    }
const Object objects[] = { OBJECT(_arPmxConf), OBJECT(_arPmxDispPartStatus), OBJECT(bComp0OnTop),
                           OBJECT(MutexPMX),   OBJECT(PMX_debug_level),      OBJECT(_PmxInitiated),
                           OBJECT(_fg2DCap),   OBJECT(_PmxTestOsd),          OBJECT(_fgBootUp) };

bool is_as_loaded()
{
    return _arPmxConf[0] == 1 && _arPmxConf[455] == 0 && bComp0OnTop == 4 && MutexPMX == 0 && PMX_debug_level == 5 &&
           _fgBootUp == 1;
}

} // namespace

int main()
{
    for (const Object& object : objects)
    {
        const auto symbol = board::executable_symbols::find(object.name);
        if (!symbol || symbol->address != object.address || symbol->size <= object.size)
        {
            std::printf("%s: its symbol has no bytes behind the object\n", object.name.data());
            return 1;
        }
        std::memset(object.address, 0x5A, object.size);
    }
    board::layer_state::restore();
    std::puts(is_as_loaded() ? "as loaded" : "not as loaded");
    return is_as_loaded() ? 0 : 1;
}
