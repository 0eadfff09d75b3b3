// AbiHeadersTest.cpp: the public headers in hosts' translation units. That each compiles alone and which macros they
// leave is checked when this is built and by tests/abi/headers.cmake; here the units that were compiled with <windows.h>
// before and after the headers run in one program.

#include "AbiHostUnits.h"

#include <gtest/gtest.h>

TEST(AbiHeadersTest, WindowsHeaderMayStandOnEitherSide) {
    std::string const expected = "C:/folder/file3 right v: 1.5";
    EXPECT_EQ(expected, ktabi::UseLibraryWindowsFirst());
    EXPECT_EQ(expected, ktabi::UseLibraryWindowsLast());
    EXPECT_EQ(expected, ktabi::UseLibraryWindowsFirstUnicode());
    EXPECT_EQ(expected, ktabi::UseLibraryWindowsLastUnicode());
}
