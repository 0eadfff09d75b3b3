// FakeOutlookProgram.cpp: the pretended mail program as a process of its own.
//
//     ktoutlook -Embedding    started by the system for a caller that creates an instance; ends when that has let go
//     ktoutlook /running      an instance that runs and has registered itself, until the event "KTOutlookStop" is set;
//                             it sets "KTOutlookReady" when it can be found
//
// Either sets "KTOutlookEnded" before it ends, and gives up after a minute.

#include "FakeOutlook.h"

#include <objbase.h>
#include <oleauto.h>

#include <string>

namespace {

void SetSharedEvent(wchar_t const *name) {
    HANDLE const event = CreateEventW(nullptr, TRUE, FALSE, name);
    SetEvent(event);
    CloseHandle(event);
}

// Serves calls until `isDone`, at most a minute. A call wakes it up, so it is asked after each.
template <typename Predicate> void ServeUntil(HANDLE event, Predicate isDone) {
    ULONGLONG const end = GetTickCount64() + 60000;
    while (!isDone() && GetTickCount64() < end) {
        MsgWaitForMultipleObjects(1, &event, FALSE, 100, QS_ALLINPUT);
        MSG message;
        while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE) != FALSE) {
            DispatchMessageW(&message);
        }
    }
}

void Serve(HANDLE stop) {
    IUnknown *const factory = MakeFakeOutlookFactory();
    DWORD cookie = 0;
    CoRegisterClassObject(kFakeOutlookClass, factory, CLSCTX_LOCAL_SERVER, REGCLS_MULTIPLEUSE, &cookie);
    bool wasUsed = false;
    ServeUntil(stop, [&] {
        wasUsed = wasUsed || FakeOutlookObjects() > 0;
        return wasUsed && FakeOutlookObjects() == 0;
    });
    CoRevokeClassObject(cookie);
    factory->Release();
}

void Run(HANDLE stop) {
    IUnknown *application = nullptr;
    MakeFakeOutlook(IID_IUnknown, reinterpret_cast<void **>(&application));
    DWORD cookie = 0;
    RegisterActiveObject(application, kFakeOutlookClass, ACTIVEOBJECT_STRONG, &cookie);
    SetSharedEvent(L"KTOutlookReady");
    ServeUntil(stop, [&] { return WaitForSingleObject(stop, 0) == WAIT_OBJECT_0; });
    RevokeActiveObject(cookie, nullptr);
    application->Release();
}

} // namespace

int wmain(int count, wchar_t **arguments) {
    OleInitialize(nullptr);
    HANDLE const stop = CreateEventW(nullptr, TRUE, FALSE, L"KTOutlookStop");
    if (count > 1 && std::wstring(arguments[1]) == L"/running") {
        RecordFakeOutlook("a running program");
        Run(stop);
    } else {
        RecordFakeOutlook("a started program");
        Serve(stop);
    }
    RecordFakeOutlook("objects left: " + std::to_string(FakeOutlookObjects()));
    OleUninitialize();
    CloseHandle(stop);
    SetSharedEvent(L"KTOutlookEnded");
    return 0;
}
