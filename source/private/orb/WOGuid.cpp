// WOGuid.cpp: identifiers from the system's remote procedure call library.

#include "OGuid.h"

#include <windows.h>

#include <rpc.h>

#include <algorithm>

namespace {

// The text that the library allocated for an identifier, freed by the library.
class RpcText {
  public:
    RpcText() = default;
    RpcText(RpcText const &) = delete;
    RpcText &operator=(RpcText const &) = delete;
    ~RpcText() {
        if (m_Text != nullptr) {
            RpcStringFreeW(&m_Text);
        }
    }

    bool Write(UUID &id) { return UuidToStringW(&id, &m_Text) == RPC_S_OK && m_Text != nullptr; }
    RPC_WSTR Get() const { return m_Text; }

  private:
    RPC_WSTR m_Text = nullptr;
};

// The system answers RPC_S_UUID_LOCAL_ONLY where the machine has no network card to tell it from others: unique among
// all that this machine makes, which serves as well.
bool Generate(UUID &id) {
    RPC_STATUS const status = UuidCreate(&id);
    return status == RPC_S_OK || status == RPC_S_UUID_LOCAL_ONLY;
}

} // namespace

OGuidResult OMakeGuid(OGuidText &text) {
    UUID id{};
    if (!Generate(id)) {
        return OGuidResult::kNotGenerated;
    }
    RpcText systemText;
    if (!systemText.Write(id)) {
        return OGuidResult::kNotWritten;
    }
    std::copy_n(systemText.Get(), text.size(), text.begin());
    text.back() = 0;
    return OGuidResult::kMade;
}
