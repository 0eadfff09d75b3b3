// KTFileUtilErrors.h: the file layer's reasons as the toolbox's error codes.

#pragma once

#include "KTFileUtil.h"
#include "OFileSystem.h"

/// The code of the same meaning; both lists have one order.
constexpr KTFileUtil::ErrorCodeEnum KTFileUtilError(OError error) {
    return static_cast<KTFileUtil::ErrorCodeEnum>(static_cast<int>(error));
}

static_assert(KTFileUtilError(OError::None) == KTFileUtil::kErrorNone);
static_assert(KTFileUtilError(OError::Failed) == KTFileUtil::kErrorFailed);
static_assert(KTFileUtilError(OError::NotFound) == KTFileUtil::kErrorNotFound);
static_assert(KTFileUtilError(OError::InvalidName) == KTFileUtil::kErrorInvalidName);
static_assert(KTFileUtilError(OError::NotAFolder) == KTFileUtil::kErrorNotAFolder);
static_assert(KTFileUtilError(OError::IsAFolder) == KTFileUtil::kErrorIsAFolder);
static_assert(KTFileUtilError(OError::AlreadyExists) == KTFileUtil::kErrorAlreadyExists);
static_assert(KTFileUtilError(OError::AccessDenied) == KTFileUtil::kErrorAccessDenied);
static_assert(KTFileUtilError(OError::InUse) == KTFileUtil::kErrorInUse);
static_assert(KTFileUtilError(OError::DiskFull) == KTFileUtil::kErrorDiskFull);
static_assert(KTFileUtilError(OError::NotReady) == KTFileUtil::kErrorNotReady);
static_assert(KTFileUtilError(OError::NotEmpty) == KTFileUtil::kErrorNotEmpty);
static_assert(KTFileUtilError(OError::NoApplication) == KTFileUtil::kErrorNoApplication);
