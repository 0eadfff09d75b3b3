// IKTGeneralProgressCallBack.cpp: what every implementation of the interface has: being created and destroyed.

#include "IKTGeneralProgressCallBack.h"

IKTGeneralProgressCallBack::IKTGeneralProgressCallBack() = default;
IKTGeneralProgressCallBack::IKTGeneralProgressCallBack(IKTGeneralProgressCallBack const &) = default;
IKTGeneralProgressCallBack &IKTGeneralProgressCallBack::operator=(IKTGeneralProgressCallBack const &) = default;
IKTGeneralProgressCallBack::~IKTGeneralProgressCallBack() = default;
