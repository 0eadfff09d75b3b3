// WODataProtection.cpp: protection by the system's data protection interface, with the user's credentials.

#include "ODataProtection.h"

#include <windows.h>

#include <dpapi.h>

#include <limits>

namespace {

// What the system allocated for a result: overwritten and given back.
class SystemBlob {
  public:
    SystemBlob() = default;
    SystemBlob(SystemBlob const &) = delete;
    SystemBlob &operator=(SystemBlob const &) = delete;
    ~SystemBlob() {
        if (m_Blob.pbData != nullptr) {
            SecureZeroMemory(m_Blob.pbData, m_Blob.cbData);
            LocalFree(m_Blob.pbData);
        }
    }

    DATA_BLOB *Receive() { return &m_Blob; }
    std::span<unsigned char const> Get() const { return {m_Blob.pbData, m_Blob.cbData}; }

  private:
    DATA_BLOB m_Blob{};
};

// The system takes what it only reads as if it wrote it.
bool MakeBlob(std::span<unsigned char const> bytes, DATA_BLOB &blob) {
    if (bytes.size() > std::numeric_limits<DWORD>::max()) {
        return false;
    }
    blob.cbData = static_cast<DWORD>(bytes.size());
    blob.pbData = const_cast<unsigned char *>(bytes.data());
    return true;
}

} // namespace

std::vector<unsigned char> OProtectData(std::span<unsigned char const> data) {
    DATA_BLOB in{};
    SystemBlob out;
    if (!MakeBlob(data, in) ||
        CryptProtectData(&in, nullptr, nullptr, nullptr, nullptr, CRYPTPROTECT_UI_FORBIDDEN, out.Receive()) == FALSE) {
        return {};
    }
    return {out.Get().begin(), out.Get().end()};
}

std::optional<OSecretBytes> OUnprotectData(std::span<unsigned char const> bytes) {
    DATA_BLOB in{};
    SystemBlob out;
    if (!MakeBlob(bytes, in) || CryptUnprotectData(&in, nullptr, nullptr, nullptr, nullptr, CRYPTPROTECT_UI_FORBIDDEN,
                                                   out.Receive()) == FALSE) {
        return std::nullopt;
    }
    return std::optional<OSecretBytes>(std::in_place, out.Get());
}
