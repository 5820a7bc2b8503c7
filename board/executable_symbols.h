// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The symbol table of the running executable, local symbols included: finds the private objects of the layer also in
 *  the object that ships, the way a debugger does. Throws std::runtime_error when the executable was stripped. */
#pragma once

#include <cstddef>
#include <functional>
#include <optional>
#include <string_view>

namespace board::executable_symbols
{

struct Symbol
{
    void* address;
    std::size_t size;
};

/** Whether the executable still has its symbol table. */
bool available();

/** The object or function of this (mangled) name; a global one goes before local ones. Two local ones of the same name
 *  at different addresses are an error: std::runtime_error. */
std::optional<Symbol> find(std::string_view name);

/** Every object and function whose name begins so, with the rest of its name. */
void for_each(std::string_view prefix,
              const std::function<void(std::string_view rest, Symbol symbol, bool is_function)>& told);

/** From now on what is called so with this prefix goes before what is called so without, and names are told without
 *  it: another layer takes the place of the first. */
void prefer(std::string_view prefix);
bool prefers();

/** Name of the object or function that begins at an address; empty when there is none, or no symbol table. */
std::string_view name_at(const void* address);

} // namespace board::executable_symbols
