// FakeOutlook.cpp: the objects of the pretended mail program.

#include "FakeOutlook.h"

#include <objbase.h>
#include <oleauto.h>

#include <atomic>
#include <iterator>

#if defined(__GNUC__)
// The system's interfaces have no destructor, as their tables have no place for one; objects here end by Release.
#pragma GCC diagnostic ignored "-Wnon-virtual-dtor"
#endif

namespace {

std::atomic<long> liveObjects = 0;

std::string Utf8(wchar_t const *text, std::size_t length) {
    std::string utf8(length * 3, '\0');
    int const size = WideCharToMultiByte(CP_UTF8, 0, text, static_cast<int>(length), utf8.data(),
                                         static_cast<int>(utf8.size()), nullptr, nullptr);
    utf8.resize(static_cast<std::size_t>(size));
    std::string escaped;
    for (char const byte : utf8) {
        escaped += byte == '\r' ? "\\r" : byte == '\n' ? "\\n" : std::string(1, byte);
    }
    return escaped;
}

std::wstring Setting(wchar_t const *name) {
    wchar_t value[1024] = {};
    DWORD size = sizeof value;
    RegGetValueW(HKEY_CURRENT_USER, kFakeOutlookSettings, name, RRF_RT_REG_SZ, nullptr, value, &size);
    return value;
}

enum class Kind { Application, NameSpace, Folder, MailItem, Attachments, Attachment, Inspector, None };

char const *NameOf(Kind kind) {
    constexpr char const *names[] = {"Application", "NameSpace",  "Folder",    "MailItem",
                                     "Attachments", "Attachment", "Inspector", "none"};
    return names[static_cast<int>(kind)];
}

struct Member {
    Kind owner;
    wchar_t const *name;
    WORD use;
    Kind result;
};

// Names are compared letter for letter, which the real program is not so strict about.
constexpr Member kMembers[] = {
    {Kind::Application, L"GetNameSpace", DISPATCH_METHOD, Kind::NameSpace},
    {Kind::NameSpace, L"GetDefaultFolder", DISPATCH_METHOD, Kind::Folder},
    {Kind::Folder, L"Display", DISPATCH_METHOD, Kind::None},
    {Kind::Application, L"CreateItem", DISPATCH_METHOD, Kind::MailItem},
    {Kind::MailItem, L"Subject", DISPATCH_PROPERTYPUT, Kind::None},
    {Kind::MailItem, L"Body", DISPATCH_PROPERTYPUT, Kind::None},
    {Kind::MailItem, L"To", DISPATCH_PROPERTYPUT, Kind::None},
    {Kind::MailItem, L"Cc", DISPATCH_PROPERTYPUT, Kind::None},
    {Kind::MailItem, L"Attachments", DISPATCH_PROPERTYGET, Kind::Attachments},
    {Kind::Attachments, L"Add", DISPATCH_METHOD, Kind::Attachment},
    {Kind::MailItem, L"GetInspector", DISPATCH_PROPERTYGET, Kind::Inspector},
    {Kind::MailItem, L"Send", DISPATCH_METHOD, Kind::None},
    {Kind::Inspector, L"Activate", DISPATCH_METHOD, Kind::None},
};

// An object that knows IUnknown alone.
class Stranger : public IUnknown {
  public:
    Stranger() { ++liveObjects; }
    virtual ~Stranger() { --liveObjects; }
    HRESULT WINAPI QueryInterface(REFIID iid, void **object) override {
        *object = IsEqualIID(iid, IID_IUnknown) ? this : nullptr;
        if (*object == nullptr) {
            return E_NOINTERFACE;
        }
        AddRef();
        return S_OK;
    }
    ULONG WINAPI AddRef() override { return ++m_References; }
    ULONG WINAPI Release() override {
        ULONG const left = --m_References;
        if (left == 0) {
            delete this;
        }
        return left;
    }

  private:
    std::atomic<ULONG> m_References = 1;
};

class Object : public IDispatch {
  public:
    explicit Object(Kind kind) : m_Kind(kind) {
        ++liveObjects;
        RecordFakeOutlook(std::string("+ ") + NameOf(kind));
    }
    Object(Object const &) = delete;
    Object &operator=(Object const &) = delete;
    virtual ~Object() {
        RecordFakeOutlook(std::string("- ") + NameOf(m_Kind));
        --liveObjects;
    }

    HRESULT WINAPI QueryInterface(REFIID iid, void **object) override {
        bool const isKnown = IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IDispatch);
        *object = isKnown ? this : nullptr;
        if (!isKnown) {
            return E_NOINTERFACE;
        }
        AddRef();
        return S_OK;
    }
    ULONG WINAPI AddRef() override { return ++m_References; }
    ULONG WINAPI Release() override {
        ULONG const left = --m_References;
        if (left == 0) {
            delete this;
        }
        return left;
    }
    HRESULT WINAPI GetTypeInfoCount(UINT *count) override {
        *count = 0;
        return S_OK;
    }
    HRESULT WINAPI GetTypeInfo(UINT, LCID, ITypeInfo **) override { return E_NOTIMPL; }

    HRESULT WINAPI GetIDsOfNames(REFIID, LPOLESTR *names, UINT, LCID, DISPID *ids) override {
        for (Member const &member : kMembers) {
            if (member.owner == m_Kind && std::wstring(member.name) == names[0] && !FailsBy(member, L"name")) {
                ids[0] = static_cast<DISPID>(&member - kMembers);
                return S_OK;
            }
        }
        ids[0] = DISPID_UNKNOWN;
        return DISP_E_UNKNOWNNAME;
    }

    HRESULT WINAPI Invoke(DISPID id, REFIID, LCID, WORD flags, DISPPARAMS *parameters, VARIANT *result,
                          EXCEPINFO *exception, UINT *) override {
        if (id < 0 || id >= static_cast<DISPID>(std::size(kMembers)) || kMembers[id].owner != m_Kind ||
            kMembers[id].use != flags) {
            RecordFakeOutlook("! wrong member or use");
            return DISP_E_MEMBERNOTFOUND;
        }
        Member const &member = kMembers[id];
        RecordFakeOutlook(Described(member, *parameters));
        if (FailsBy(member, L"call")) {
            return E_FAIL;
        }
        if (FailsBy(member, L"exception")) {
            exception->bstrDescription = SysAllocString(L"not today \u2693");
            exception->bstrSource = SysAllocString(L"ktoutlook");
            return DISP_E_EXCEPTION;
        }
        return Answer(member, result);
    }

  private:
    static bool FailsBy(Member const &member, wchar_t const *how) {
        return Setting(L"FailAt") == member.name && Setting(L"FailHow") == how;
    }

    static HRESULT Answer(Member const &member, VARIANT *result) {
        if (member.result == Kind::None || FailsBy(member, L"empty")) {
            return S_OK;
        }
        if (result == nullptr) {
            RecordFakeOutlook("! nowhere to put the result");
            return E_POINTER;
        }
        if (FailsBy(member, L"other")) {
            result->vt = VT_UNKNOWN;
            result->punkVal = new Stranger;
            return S_OK;
        }
        result->vt = VT_DISPATCH;
        result->pdispVal = FailsBy(member, L"null") ? nullptr : new Object(member.result);
        return S_OK;
    }

    static std::string Described(Member const &member, DISPPARAMS const &parameters) {
        std::string values;
        for (UINT i = parameters.cArgs; i-- > 0;) {
            VARIANT const &value = parameters.rgvarg[i];
            if (value.vt == VT_BSTR) {
                values.append("\"").append(Utf8(value.bstrVal, SysStringLen(value.bstrVal))).append("\"");
            } else if (value.vt == VT_I4) {
                values += std::to_string(value.lVal);
            } else {
                values.append("a value of type ").append(std::to_string(value.vt));
            }
        }
        std::string const name = std::string(NameOf(member.owner)) + "." + Utf8(member.name, wcslen(member.name));
        if (member.use == DISPATCH_PROPERTYPUT) {
            bool const isNamed = parameters.cNamedArgs == 1 && parameters.rgdispidNamedArgs[0] == DISPID_PROPERTYPUT;
            return name + (isNamed ? " = " : " misses its named value ") + values;
        }
        return member.use == DISPATCH_PROPERTYGET ? name + values : name + "(" + values + ")";
    }

    Kind m_Kind;
    std::atomic<ULONG> m_References = 1;
};

class Factory : public IClassFactory {
  public:
    Factory() = default;
    Factory(Factory const &) = delete;
    Factory &operator=(Factory const &) = delete;
    virtual ~Factory() = default;

    HRESULT WINAPI QueryInterface(REFIID iid, void **object) override {
        bool const isKnown = IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IClassFactory);
        *object = isKnown ? this : nullptr;
        if (!isKnown) {
            return E_NOINTERFACE;
        }
        AddRef();
        return S_OK;
    }
    ULONG WINAPI AddRef() override { return ++m_References; }
    ULONG WINAPI Release() override {
        ULONG const left = --m_References;
        if (left == 0) {
            delete this;
        }
        return left;
    }
    HRESULT WINAPI CreateInstance(IUnknown *outer, REFIID iid, void **object) override {
        return outer != nullptr ? CLASS_E_NOAGGREGATION : MakeFakeOutlook(iid, object);
    }
    HRESULT WINAPI LockServer(BOOL) override { return S_OK; }

  private:
    std::atomic<ULONG> m_References = 1;
};

} // namespace

long FakeOutlookObjects() { return liveObjects; }

HRESULT MakeFakeOutlook(REFIID iid, void **object) {
    *object = nullptr;
    if (Setting(L"FailHow") == L"create") {
        return E_OUTOFMEMORY;
    }
    auto *const application = new Object(Kind::Application);
    HRESULT const result = application->QueryInterface(iid, object);
    application->Release();
    return result;
}

IUnknown *MakeFakeOutlookFactory() { return new Factory; }

void RecordFakeOutlook(std::string const &line) {
    HANDLE const file = CreateFileW(Setting(L"Record").c_str(), FILE_APPEND_DATA, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                    nullptr, OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) {
        return;
    }
    std::string const text = line + "\n";
    DWORD written = 0;
    WriteFile(file, text.data(), static_cast<DWORD>(text.size()), &written, nullptr);
    CloseHandle(file);
}
