// FakeOutlookModule.cpp: the pretended mail program as a DLL that is loaded into its caller.

#include "FakeOutlook.h"

#include <objbase.h>

extern "C" {

HRESULT WINAPI DllGetClassObject(REFCLSID classId, REFIID iid, LPVOID *object) {
    *object = nullptr;
    if (!IsEqualCLSID(classId, kFakeOutlookClass)) {
        return CLASS_E_CLASSNOTAVAILABLE;
    }
    IUnknown *const factory = MakeFakeOutlookFactory();
    HRESULT const result = factory->QueryInterface(iid, object);
    factory->Release();
    return result;
}

HRESULT WINAPI DllCanUnloadNow() { return FakeOutlookObjects() == 0 ? S_OK : S_FALSE; }
}
