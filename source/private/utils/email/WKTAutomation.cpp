// WKTAutomation.cpp: calls by name through IDispatch.

#include "WKTAutomation.h"

#include <new>

namespace {

// What a failed call tells; owns its texts.
class Exception {
  public:
    Exception() = default;
    Exception(Exception const &) = delete;
    Exception &operator=(Exception const &) = delete;
    ~Exception() {
        SysFreeString(m_Info.bstrSource);
        SysFreeString(m_Info.bstrDescription);
        SysFreeString(m_Info.bstrHelpFile);
    }

    EXCEPINFO *Receive() noexcept { return &m_Info; }

    std::wstring Reason() {
        if (m_Info.pfnDeferredFillIn != nullptr) {
            m_Info.pfnDeferredFillIn(&m_Info);
        }
        return {m_Info.bstrDescription, m_Info.bstrDescription + SysStringLen(m_Info.bstrDescription)};
    }

  private:
    EXCEPINFO m_Info{};
};

} // namespace

WKTVariant::WKTVariant(long number) noexcept {
    VariantInit(&m_Value);
    m_Value.vt = VT_I4;
    m_Value.lVal = number;
}

WKTVariant::WKTVariant(KTString const &text) {
    VariantInit(&m_Value);
    std::wstring const wide = text.GetWstring();
    m_Value.bstrVal = SysAllocStringLen(wide.data(), static_cast<UINT>(wide.size()));
    if (m_Value.bstrVal == nullptr) {
        throw std::bad_alloc();
    }
    m_Value.vt = VT_BSTR;
}

HRESULT WKTAutomationObject::Attach(CLSID const &classId) noexcept {
    WOComPointer<IUnknown> running;
    HRESULT const found = GetActiveObject(classId, nullptr, reinterpret_cast<IUnknown **>(running.Receive()));
    return FAILED(found) ? found : running->QueryInterface(IID_IDispatch, m_Object.Receive());
}

HRESULT WKTAutomationObject::Create(CLSID const &classId) noexcept {
    return CoCreateInstance(classId, nullptr, CLSCTX_INPROC_SERVER | CLSCTX_LOCAL_SERVER, IID_IDispatch,
                            m_Object.Receive());
}

WKTAutomationResult WKTAutomationObject::Call(wchar_t const *method, WKTAutomationObject *made) {
    return Invoke(method, DISPATCH_METHOD, nullptr, made);
}

WKTAutomationResult WKTAutomationObject::Call(wchar_t const *method, WKTVariant const &argument,
                                              WKTAutomationObject *made) {
    return Invoke(method, DISPATCH_METHOD, &argument, made);
}

WKTAutomationResult WKTAutomationObject::Read(wchar_t const *property, WKTAutomationObject *object) {
    return Invoke(property, DISPATCH_PROPERTYGET, nullptr, object);
}

WKTAutomationResult WKTAutomationObject::Set(wchar_t const *property, KTString const &text) {
    WKTVariant const value(text);
    return Invoke(property, DISPATCH_PROPERTYPUT, &value, nullptr);
}

WKTAutomationResult WKTAutomationObject::Invoke(wchar_t const *member, WORD kind, WKTVariant const *argument,
                                                WKTAutomationObject *object) {
    DISPID id = DISPID_UNKNOWN;
    auto *name = const_cast<LPOLESTR>(member); // read only
    HRESULT const known = m_Object->GetIDsOfNames(IID_NULL, &name, 1, LOCALE_USER_DEFAULT, &id);
    if (FAILED(known)) {
        return {known, {}};
    }
    DISPID assigned = DISPID_PROPERTYPUT;
    DISPPARAMS parameters{};
    if (argument != nullptr) {
        parameters.cArgs = 1;
        parameters.rgvarg = const_cast<VARIANT *>(argument->Get()); // read only
    }
    if (kind == DISPATCH_PROPERTYPUT) {
        parameters.cNamedArgs = 1;
        parameters.rgdispidNamedArgs = &assigned;
    }
    WKTVariant result;
    Exception exception;
    HRESULT const done =
        m_Object->Invoke(id, IID_NULL, LOCALE_USER_DEFAULT, kind, &parameters,
                         kind == DISPATCH_PROPERTYPUT ? nullptr : result.Receive(), exception.Receive(), nullptr);
    if (FAILED(done)) {
        return {done, done == DISP_E_EXCEPTION ? exception.Reason() : std::wstring()};
    }
    if (object == nullptr) {
        return {};
    }
    VARIANT const &value = *result.Get();
    if (value.vt != VT_DISPATCH || value.pdispVal == nullptr) {
        return {DISP_E_TYPEMISMATCH, {}};
    }
    return {value.pdispVal->QueryInterface(IID_IDispatch, object->m_Object.Receive()), {}};
}
