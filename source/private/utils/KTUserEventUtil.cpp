// KTUserEventUtil.cpp: the relay of user events.

#include "KTUserEventUtil.h"

KTUserEventUtil::LogFunctionCallBack KTUserEventUtil::m_CallBack = nullptr;

KTUserEventUtil &KTUserEventUtil::operator=(KTUserEventUtil const &) = default;

void KTUserEventUtil::RegisterLogFunctionCallBack(LogFunctionCallBack callBack) {
    if (callBack != nullptr) {
        m_CallBack = callBack;
    }
}

void KTUserEventUtil::LogUserEvent(KTString const &first, KTString const &second, KTString const &third) {
    if (m_CallBack != nullptr) {
        m_CallBack(first.GetUTF8String().c_str(), second.GetUTF8String().c_str(), third.GetUTF8String().c_str());
    }
}
