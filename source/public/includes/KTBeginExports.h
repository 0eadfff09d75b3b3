// KTBeginExports.h: opens the exported part of a public header.
//
// Every public header includes this file after its own includes and KTEndExports.h as its last line. Between the two,
// KT_PUBLIC_API marks what crosses the library boundary; after the second, the macro is gone again, so that the
// library's headers leave no macro in the host's translation unit. There is no include guard: the pair is used often.

#if defined(_WIN32)
#if defined(KTPUBLIC_BUILD)
#define KT_PUBLIC_API __declspec(dllexport)
#else
#define KT_PUBLIC_API __declspec(dllimport)
#endif
#else
#define KT_PUBLIC_API __attribute__((visibility("default")))
#endif

#if defined(_MSC_VER)
#pragma warning(push)
// Private members of exported classes may have standard library types: host and library share one run-time.
#pragma warning(disable : 4251 4275)
// Attributes that only GCC and Clang know.
#pragma warning(disable : 5030)
#elif defined(__GNUC__)
#pragma GCC diagnostic push
// A few exported functions return constant values, as their callers expect; hosts that warn about it need not know.
#pragma GCC diagnostic ignored "-Wignored-qualifiers"
#endif
