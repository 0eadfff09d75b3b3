// WKTFile.cpp: the file's path as the system's own characters.

#include "KTFile.h"

static_assert(sizeof(wchar_t) == sizeof(unsigned short));

wchar_t const *KTFile::GrabTString() const {
    // The same 16 bits under another name: the system reads them through this pointer, nobody writes.
    return reinterpret_cast<wchar_t const *>(m_File.GetPath().GetString().c_str());
}
