// KTEndExports.h: closes what KTBeginExports.h opened and takes its macro away. Deliberately without an include guard.

#undef KT_PUBLIC_API

#if defined(_MSC_VER)
#pragma warning(pop)
#elif defined(__GNUC__)
#pragma GCC diagnostic pop
#endif
