// FakeOutlook.h: an automation server that poses as a mail program and writes down every call.
//
// It runs inside the test (FakeOutlookModule.cpp) or as a program of its own (FakeOutlookProgram.cpp). Its settings are
// values of the key HKEY_CURRENT_USER\Software\KTPublic mail test:
//
//     Record   the file that it appends to, one line each: "+ OBJECT" made, "- OBJECT" gone, and the calls in between
//     FailAt   the member that fails
//     FailHow  name: it is unknown; call: E_FAIL; exception: with a description; empty: no value; null: no object;
//              other: an object without IDispatch; create: there is no application

#pragma once

#include <windows.h>

#include <objbase.h>

#include <string>

inline constexpr wchar_t kFakeOutlookSettings[] = L"Software\\KTPublic mail test";
inline constexpr GUID kFakeOutlookClass = {
    0x5f0c9a34, 0x7c1e, 0x4d0b, {0x9d, 0x21, 0x0a, 0x6b, 0x3e, 0x58, 0xc4, 0x17}};

/// How many objects live.
long FakeOutlookObjects();

/// Makes the application object; the caller owns the reference.
HRESULT MakeFakeOutlook(REFIID iid, void **object);

/// Makes the class factory; the caller owns the reference.
IUnknown *MakeFakeOutlookFactory();

/// Appends a line to the record.
void RecordFakeOutlook(std::string const &line);
