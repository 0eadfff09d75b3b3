// KTCallBack.h: a small record that hosts hand around to say how they want to be called back. Nothing in the library
// reads it.
//
//     record, 32 bytes
//          0  i32    kind
//          8  u64    data1
//         16  u64    data2
//         24  void*  context

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// Kind of a KTCallBack. All values are the host's, who gives them names and meanings of its own.
enum KTCallBackEnum : int {};

/// A call-back record. Any thread may use its own; one record is not locked.
struct KT_PUBLIC_API KTCallBack {
    /// Of the given kind; the rest is zero.
    explicit KTCallBack(KTCallBackEnum callBackKind);
    KTCallBack(KTCallBack const &other);            ///< member by member
    KTCallBack &operator=(KTCallBack const &other); ///< member by member
    ~KTCallBack(); // NOLINT(performance-trivially-destructible): exported, as the other operations are

    KTCallBackEnum kind;
    KTUInt64 data1;
    KTUInt64 data2;
    void *context; ///< belongs to the host
};

#include "KTEndExports.h"
