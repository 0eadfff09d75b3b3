// KTCallBack.cpp: the call-back record.

#include "KTCallBack.h"

KTCallBack::KTCallBack(KTCallBackEnum callBackKind) : kind(callBackKind), data1(0), data2(0), context(nullptr) {}
KTCallBack::KTCallBack(KTCallBack const &other) = default;
KTCallBack &KTCallBack::operator=(KTCallBack const &other) = default;
KTCallBack::~KTCallBack() = default;
