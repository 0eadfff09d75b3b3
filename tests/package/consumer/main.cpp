// Uses some of the installed library and says from where it was loaded.

#include <KTPublic.h>

#include <windows.h>

#include <cstdint>
#include <cstdio>
#include <exception>

int main() {
    KTMutex mutex;
    KTLock lock(mutex);
    KTString text("Gr\xC3\xB6\xC3\x9F"
                  "e ");
    text.AppendNumber(12);
    std::printf("text %s, %d units\n", text.GetUTF8String().c_str(), static_cast<int>(text.size()));

    try {
        lock.lock();
    } catch (std::exception const &error) {
        std::printf("caught %s\n", error.what()[0] != 0 ? "an exception" : "nothing");
    }

    // Compiled with the option that the package brings.
    KTExceptionUtils::InstallExceptionHandler();
    try {
        std::uintptr_t volatile address = 0x40;
        *reinterpret_cast<int volatile *>(address) = 1; // NOLINT(performance-no-int-to-ptr)
    } catch (WKTSEHException const &fault) {
        std::printf("caught fault %X\n", fault.getSENumber());
    }

    gKTLogger->Log("written by %s", "the consumer");
    std::printf("log %s\n", gKTLogger->GetLogFilePath().GetPathAsKTString().GetUTF8String().c_str());

    for (char const *const name : {"KTPublic.dll", "libstdc++-6.dll", "libgcc_s_seh-1.dll", "libwinpthread-1.dll"}) {
        wchar_t path[MAX_PATH] = L"";
        GetModuleFileNameW(GetModuleHandleA(name), path, MAX_PATH);
        std::printf("loaded %ls\n", path);
    }
    return 0;
}
