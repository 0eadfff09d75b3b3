// KTException.cpp: exceptions with a message key.

#include "KTException.h"

#include "KTExceptionMsgManager.h"

KTException::KTException(char const *key) : m_ExceptionType(key) {}

KTException::KTException(KTString &key) : m_ExceptionType(nullptr), m_ExceptionTypeCopy(key.GetUTF8String()) {
    m_ExceptionType = m_ExceptionTypeCopy.c_str();
}

KTException::KTException(KTException const &other)
    : std::exception(other), m_ExceptionType(other.m_ExceptionType), m_ExceptionTypeCopy(other.m_ExceptionTypeCopy) {
    if (other.HoldsKey()) {
        m_ExceptionType = m_ExceptionTypeCopy.c_str();
    }
}

KTException &KTException::operator=(KTException const &other) {
    if (this != &other) {
        std::exception::operator=(other);
        m_ExceptionTypeCopy = other.m_ExceptionTypeCopy;
        m_ExceptionType = other.HoldsKey() ? m_ExceptionTypeCopy.c_str() : other.m_ExceptionType;
    }
    return *this;
}

KTException::~KTException() = default;

char const *KTException::what() const noexcept { return m_ExceptionType == nullptr ? "" : m_ExceptionType; }

KTString const &KTException::What() const { return KTExceptionMsgManager::GetExceptionMessage(m_ExceptionType); }

char const *KTException::GetExceptionType() const { return m_ExceptionType; }

bool KTException::HoldsKey() const { return m_ExceptionType == m_ExceptionTypeCopy.c_str(); }

KTFatalException::KTFatalException(char const *key) : KTException(key) {}
KTFatalException::KTFatalException(KTString &key) : KTException(key) {}
KTFatalException::KTFatalException(KTFatalException const &other) = default;
KTFatalException &KTFatalException::operator=(KTFatalException const &other) = default;
KTFatalException::~KTFatalException() = default;

KTNonFatalException::KTNonFatalException(char const *key) : KTException(key) {}
KTNonFatalException::KTNonFatalException(KTNonFatalException const &other) = default;
KTNonFatalException &KTNonFatalException::operator=(KTNonFatalException const &other) = default;
KTNonFatalException::~KTNonFatalException() = default;
