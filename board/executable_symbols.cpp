// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/executable_symbols.h"

#include <elf.h>
#include <fcntl.h>
#include <link.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstring>
#include <map>
#include <span>
#include <stdexcept>
#include <string>

namespace board::executable_symbols
{
namespace
{

/** Looked up by scanning: a process asks for a handful of names, and must start quickly. */
struct Table
{
    std::span<const ElfW(Sym)> symbols; ///< empty when stripped
    const char* names = nullptr;
    std::size_t names_size = 0;
    std::uintptr_t base = 0; ///< added to the file's addresses: 0 unless the executable is position-independent

    void* address(const ElfW(Sym) & symbol) const { return reinterpret_cast<void*>(base + symbol.st_value); }
    // There are tens of thousands, which a checked build goes through much faster by plain pointers.
    const ElfW(Sym) * begin() const { return symbols.data(); }
    const ElfW(Sym) * end() const { return symbols.data() + symbols.size(); }
};

/** The executable's file, mapped for as long as the process lives. */
std::span<const char> executable_file()
{
    const int file = open("/proc/self/exe", O_RDONLY | O_CLOEXEC);
    struct stat status
    {
    };
    if (file < 0 || fstat(file, &status) != 0)
        throw std::runtime_error("this executable's file cannot be read");
    const auto size = static_cast<std::size_t>(status.st_size);
    void* const mapped = mmap(nullptr, size, PROT_READ, MAP_PRIVATE, file, 0);
    close(file);
    if (mapped == MAP_FAILED)
        throw std::runtime_error("this executable's file cannot be read");
    return { static_cast<const char*>(mapped), size };
}

std::uintptr_t load_base()
{
    std::uintptr_t base = 0;
    dl_iterate_phdr(
        [](dl_phdr_info* info, std::size_t, void* result) {
            *static_cast<std::uintptr_t*>(result) = info->dlpi_addr;
            return 1; // the executable comes first
        },
        &base);
    return base;
}

template <typename T>
std::span<const T> items_at(std::span<const char> file, std::size_t offset, std::size_t count)
{
    if (offset > file.size() || count > (file.size() - offset) / sizeof(T) || offset % alignof(T) != 0)
        throw std::runtime_error("this executable's file is damaged: a table reaches past its end");
    return { reinterpret_cast<const T*>(file.data() + offset), count };
}

Table read_table()
{
    const auto file = executable_file();
    const auto& header = items_at<ElfW(Ehdr)>(file, 0, 1).front();
    const unsigned char native = sizeof(void*) == 8 ? ELFCLASS64 : ELFCLASS32;
    if (std::memcmp(header.e_ident, ELFMAG, SELFMAG) != 0 || header.e_ident[EI_CLASS] != native)
        throw std::runtime_error("this executable is no ELF file of this machine");
    Table table;
    table.base = load_base();
    const auto sections = items_at<ElfW(Shdr)>(file, header.e_shoff, header.e_shnum);
    for (const ElfW(Shdr) & section : sections)
    {
        if (section.sh_type != SHT_SYMTAB || section.sh_link >= sections.size())
            continue;
        const auto names = items_at<char>(file, sections[section.sh_link].sh_offset, sections[section.sh_link].sh_size);
        table.symbols = items_at<ElfW(Sym)>(file, section.sh_offset, section.sh_size / sizeof(ElfW(Sym)));
        table.names = names.data();
        table.names_size = names.size();
    }
    return table;
}

const Table& table()
{
    static const Table instance = read_table();
    return instance;
}

/** Whether a symbol is an object or function of the executable itself; start-up code has some without a name. */
bool is_defined(const ElfW(Sym) & symbol)
{
    const unsigned type = symbol.st_info & 0xF;
    return symbol.st_shndx != SHN_UNDEF && symbol.st_name != 0 && (type == STT_OBJECT || type == STT_FUNC);
}

bool is_global(const ElfW(Sym) & symbol)
{
    return (symbol.st_info >> 4) != STB_LOCAL;
}

/** What gives way to another definition; it may have a second name, which is not what people call it. */
bool is_weak(const ElfW(Sym) & symbol)
{
    return (symbol.st_info >> 4) == STB_WEAK;
}

std::string_view name_of(const Table& from, const ElfW(Sym) & symbol)
{
    if (symbol.st_name >= from.names_size)
        return {};
    return { from.names + symbol.st_name, strnlen(from.names + symbol.st_name, from.names_size - symbol.st_name) };
}

/** Whether that many characters and an end can stand where the symbol's name begins. */
bool has_room(const Table& from, const ElfW(Sym) & symbol, std::size_t size)
{
    return symbol.st_name < from.names_size && from.names_size - symbol.st_name > size;
}

bool has_name(const Table& from, const ElfW(Sym) & symbol, std::string_view name)
{
    // Where the name ends tells nearly all others apart.
    return has_room(from, symbol, name.size()) && from.names[symbol.st_name + name.size()] == '\0' &&
           std::memcmp(from.names + symbol.st_name, name.data(), name.size()) == 0;
}

bool begins_with(const Table& from, const ElfW(Sym) & symbol, std::string_view prefix)
{
    return has_room(from, symbol, prefix.size()) &&
           std::memcmp(from.names + symbol.st_name, prefix.data(), prefix.size()) == 0;
}

/** See prefer(). */
std::string& preferred()
{
    static std::string prefix;
    return prefix;
}

std::map<const void*, std::string_view>& known_names()
{
    static std::map<const void*, std::string_view> known;
    return known;
}

std::optional<Symbol> find_exactly(std::string_view name)
{
    const Table& all = table();
    std::optional<Symbol> found;
    bool ambiguous = false;
    for (const ElfW(Sym) & symbol : all)
    {
        if (!is_defined(symbol) || !has_name(all, symbol, name))
            continue;
        const Symbol candidate{ all.address(symbol), symbol.st_size };
        if (is_global(symbol))
            return candidate;
        ambiguous = ambiguous || (found && found->address != candidate.address);
        found = candidate;
    }
    if (ambiguous)
        throw std::runtime_error("this executable has more than one private " + std::string(name));
    return found;
}

} // namespace

bool available()
{
    return !table().symbols.empty();
}

std::optional<Symbol> find(std::string_view name)
{
    if (!available())
        throw std::runtime_error("this executable was stripped: without its symbol table nothing can be found in it; "
                                 "build it without -s and without strip");
    if (prefers())
    {
        if (const auto found = find_exactly(preferred() + std::string(name)))
            return found;
    }
    return find_exactly(name);
}

void for_each(std::string_view prefix,
              const std::function<void(std::string_view rest, Symbol symbol, bool is_function)>& told)
{
    const Table& all = table();
    for (const ElfW(Sym) & symbol : all)
    {
        if (is_defined(symbol) && begins_with(all, symbol, prefix))
            told(name_of(all, symbol).substr(prefix.size()), { all.address(symbol), symbol.st_size },
                 (symbol.st_info & 0xF) == STT_FUNC);
    }
}

void prefer(std::string_view prefix)
{
    preferred() = prefix;
    known_names().clear();
}

bool prefers()
{
    return !preferred().empty();
}

std::string_view name_at(const void* address)
{
    auto& known = known_names();
    if (const auto found = known.find(address); found != known.end())
        return found->second;
    const Table& all = table();
    const std::uintptr_t value = reinterpret_cast<std::uintptr_t>(address) - all.base;
    std::string_view name;
    for (const ElfW(Sym) & symbol : all)
    {
        if (!is_defined(symbol) || symbol.st_value != value)
            continue;
        if (name.empty() || is_global(symbol))
            name = name_of(all, symbol);
        if (is_weak(symbol))
            break;
    }
    if (prefers() && name.starts_with(preferred()))
        name.remove_prefix(preferred().size());
    return known[address] = name;
}

} // namespace board::executable_symbols
