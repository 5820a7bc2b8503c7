// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/reasons/twin.h"

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <stdexcept>
#include <string>
#include <vector>

#include "board/executable_symbols.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

using board::executable_symbols::Symbol;

constexpr std::string_view twins = "pmx_twin_";

/** The instructions that lead from one function to another, for whoever comes in at the first one's beginning. */
std::vector<unsigned char> jump(std::uintptr_t from, std::uintptr_t to)
{
    std::vector<unsigned char> code;
    const auto append = [&code](auto value) {
        std::array<unsigned char, sizeof value> bytes;
        std::memcpy(bytes.data(), &value, sizeof value);
        code.insert(code.end(), bytes.begin(), bytes.end());
    };
#if defined(__x86_64__)
    constexpr unsigned char jmp = 0xE9; // to what stands behind it, relative to its end
    append(jmp);
    append(static_cast<std::int32_t>(to - (from + 5)));
#elif defined(__aarch64__)
    constexpr std::uint32_t b = 0x14000000; // words from here, in the low 26 bits
    append(b | (static_cast<std::uint32_t>((to - from) / 4) & 0x03FFFFFF));
#elif defined(__arm__)
    constexpr std::uint16_t nop = 0xBF00;
    constexpr std::uint32_t thumb_load_pc =
        0xF000F8DF;                                   // LDR.W PC, [PC]: the word behind it, from a multiple of four on
    constexpr std::uint32_t arm_load_pc = 0xE51FF004; // LDR PC, [PC, #-4]: the word behind it
    const bool is_thumb = (from & 1) != 0;
    if (is_thumb && (from & 2) != 0)
        append(nop);
    append(is_thumb ? thumb_load_pc : arm_load_pc);
    append(static_cast<std::uint32_t>(to));
#else
    static_cast<void>(append);
    static_cast<void>(from + to);
    throw std::runtime_error(
        "the reasons cannot be asked for on this machine: no way is known to lead a call elsewhere");
#endif
    return code;
}

/** Code that goes over a function's beginning. */
struct Lead
{
    std::uintptr_t at;
    std::vector<unsigned char> code;
};

/** An object of the layer's own, and the twin's. */
struct Pair
{
    Symbol original;
    Symbol twin;
};

/** All that is to be done, looked up once: the process is copied often. */
struct Ways
{
    std::vector<Lead> leads;
    std::vector<Pair> objects;
};

Lead lead_to(const std::string& name, Symbol from, Symbol to)
{
    const auto entry = reinterpret_cast<std::uintptr_t>(from.address);
    std::vector<unsigned char> code = jump(entry, reinterpret_cast<std::uintptr_t>(to.address));
    if (code.size() > from.size)
        throw std::runtime_error(name + " is too short to lead elsewhere");
#if defined(__arm__)
    return { entry & ~std::uintptr_t{ 1 }, std::move(code) };
#else
    return { entry, std::move(code) };
#endif
}

const Ways& ways()
{
    namespace symbols = board::executable_symbols;
    static const Ways instance = [] {
        Ways found;
        symbols::for_each(twins, [&found](std::string_view rest, Symbol twin, bool is_function) {
            const std::string name(rest);
            const auto original = symbols::find(name);
            if (!original)
                return; // this program's own, or one of the layer's that nobody else can call
            if (is_function)
                found.leads.push_back(lead_to(name, *original, twin));
            else
                found.objects.push_back({ *original, twin });
        });
        if (found.leads.empty())
            throw std::runtime_error("this program was linked without the layer that tells its reasons");
        return found;
    }();
    return instance;
}

/** Write over code, which is read-only. */
void write_code(const std::vector<Lead>& leads)
{
    const auto page = static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE));
    const auto [first, last] =
        std::minmax_element(leads.begin(), leads.end(), [](const Lead& a, const Lead& b) { return a.at < b.at; });
    auto* const pages = reinterpret_cast<void*>(first->at / page * page);
    const std::size_t size = last->at + last->code.size() - first->at / page * page;
    // This function's own code may lie between theirs.
    if (mprotect(pages, size, PROT_READ | PROT_WRITE | PROT_EXEC) != 0)
        throw std::runtime_error("the reasons cannot be asked for: this system lets no program change its code");
    for (const Lead& lead : leads)
    {
        auto* const begin = reinterpret_cast<char*>(lead.at);
        std::memcpy(begin, lead.code.data(), lead.code.size());
        __builtin___clear_cache(begin, begin + lead.code.size());
    }
    mprotect(pages, size, PROT_READ | PROT_EXEC);
}

} // namespace

void find_twin()
{
    static_cast<void>(ways());
}

void lead_in_twin()
{
    const Ways& known = ways();
    if (board::executable_symbols::prefers())
        return; // it is there: an explanation of an explanation
    for (const auto& [original, twin] : known.objects)
    {
        // Tables are equal, and read-only. A checked build pads what it compiled.
        if (std::memcmp(twin.address, original.address, twin.size) != 0)
            std::memcpy(twin.address, original.address, twin.size);
    }
    write_code(known.leads);
    board::executable_symbols::prefer(twins);
    record_view::look_again();
}

} // namespace pmxboard
