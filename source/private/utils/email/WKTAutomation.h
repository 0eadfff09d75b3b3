// WKTAutomation.h: another program's objects, driven by the names of their members. Windows half only.
//
//     WKTOleScope const ole;                       // first: what follows is released before OLE is
//     WKTAutomationObject application;
//     WKTAutomationObject item;
//     WKTAutomationResult const done = application.Call(L"CreateItem", WKTVariant(0), &item);
//
// One object belongs to the thread that made it.

#pragma once

#include "KTString.h"
#include "WOCom.h"

#include <oleauto.h>

#include <string>

/// The calling thread's use of OLE while this object lives, if it could be had.
class WKTOleScope {
  public:
    WKTOleScope() noexcept : m_Result(OleInitialize(nullptr)) {}
    WKTOleScope(WKTOleScope const &) = delete;
    WKTOleScope &operator=(WKTOleScope const &) = delete;
    ~WKTOleScope() {
        if (SUCCEEDED(m_Result)) {
            OleUninitialize();
        }
    }

    HRESULT Result() const noexcept { return m_Result; }

  private:
    HRESULT m_Result;
};

/// Owns a value of automation.
class WKTVariant {
  public:
    WKTVariant() noexcept { VariantInit(&m_Value); }
    explicit WKTVariant(long number) noexcept;

    /// Throws std::bad_alloc.
    explicit WKTVariant(KTString const &text);
    WKTVariant(WKTVariant const &) = delete;
    WKTVariant &operator=(WKTVariant const &) = delete;
    ~WKTVariant() { VariantClear(&m_Value); }

    VARIANT *Get() noexcept { return &m_Value; }
    VARIANT const *Get() const noexcept { return &m_Value; }

    /// Where a call stores a value. REQUIRES: there is none yet.
    VARIANT *Receive() noexcept { return &m_Value; }

  private:
    VARIANT m_Value{};
};

/// How a call went.
struct WKTAutomationResult {
    HRESULT code = S_OK;
    std::wstring reason; ///< what the other program says about its failure; often empty

    bool Succeeded() const noexcept { return SUCCEEDED(code); }
};

/// Owns one reference to an object. REQUIRES, for all members but the first two: there is an object.
class WKTAutomationObject {
  public:
    /// Takes the instance that runs and has registered itself.
    HRESULT Attach(CLSID const &classId) noexcept;

    /// Creates an instance in this process or in one of its own.
    HRESULT Create(CLSID const &classId) noexcept;

    /// Calls a method with at most one argument. With `made` the method must give an object, which goes there;
    /// DISP_E_TYPEMISMATCH if it gives none.
    WKTAutomationResult Call(wchar_t const *method, WKTAutomationObject *made = nullptr);
    WKTAutomationResult Call(wchar_t const *method, WKTVariant const &argument, WKTAutomationObject *made = nullptr);

    /// Reads a property that must be an object.
    WKTAutomationResult Read(wchar_t const *property, WKTAutomationObject *object);

    /// Sets a property.
    WKTAutomationResult Set(wchar_t const *property, KTString const &text);

  private:
    WKTAutomationResult Invoke(wchar_t const *member, WORD kind, WKTVariant const *argument,
                               WKTAutomationObject *object);

    WOComPointer<IDispatch> m_Object;
};
