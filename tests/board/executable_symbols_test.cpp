// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/executable_symbols.h"

#include <gtest/gtest.h>

#include "u_os.h"

// Private to this file, as the layer's own objects are in the object that ships.
static int executable_symbols_test_private asm("executable_symbols_test_private") = 5;

namespace
{

namespace symbols = board::executable_symbols;

int one_more_than_private()
{
    return executable_symbols_test_private + 1;
}

TEST(ExecutableSymbols, Find_PrivateAndPublicObjectsAndFunctions)
{
    ASSERT_TRUE(symbols::available());
    const auto object = symbols::find("executable_symbols_test_private");
    ASSERT_TRUE(object);
    EXPECT_EQ(static_cast<void*>(&executable_symbols_test_private), object->address);
    EXPECT_EQ(sizeof(int), object->size);
    *static_cast<int*>(object->address) = 7;
    EXPECT_EQ(8, one_more_than_private());

    const auto function = symbols::find("x_timer_create");
    ASSERT_TRUE(function);
    EXPECT_EQ(reinterpret_cast<void*>(x_timer_create), function->address);
    EXPECT_LT(0u, function->size);
}

TEST(ExecutableSymbols, Find_NothingOfAnotherName)
{
    EXPECT_FALSE(symbols::find("executable_symbols_test_privat"));
    EXPECT_FALSE(symbols::find("executable_symbols_test_private_"));
    EXPECT_FALSE(symbols::find(""));
    EXPECT_FALSE(symbols::find("executable_symbols_test.cpp")) << "a file is no object";
    EXPECT_FALSE(symbols::find("strlen")) << "it is another library's";
}

TEST(ExecutableSymbols, NameAt_TheBeginningOfWhatHasAName)
{
    EXPECT_EQ("executable_symbols_test_private", symbols::name_at(&executable_symbols_test_private));
    EXPECT_EQ("x_timer_create", symbols::name_at(reinterpret_cast<void*>(x_timer_create)));
    EXPECT_EQ("", symbols::name_at(reinterpret_cast<char*>(&executable_symbols_test_private) + 1));
    int nameless = 0;
    EXPECT_EQ("", symbols::name_at(&nameless));
    EXPECT_EQ("", symbols::name_at(nullptr));
}

} // namespace
