// IKTGeneralProgressCallBack.h: how a long operation tells a host's progress dialog where it is.
//
// The library only declares the interface; who shows progress implements it, who does long work calls it, in this order:
//
//     callBack.Begin(KTString("Saving the course"));
//     callBack.SetRange(0, lessons.size());
//     for (size_t i = 0; i < lessons.size() && callBack.IsCancelled() == 0; ++i) {
//         callBack.SetMessage(lessons[i].GetTitle());
//         Save(lessons[i]);
//         callBack.SetPosition(i + 1);
//     }
//     callBack.End(callBack.IsCancelled() == 0 ? kKTErrorNone : kKTErrorFailed);

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"
#include "KTTypes.h"

#include "KTBeginExports.h"

/// Shows the progress of one operation at a time. Which threads may call, the implementation says; one that shows a
/// dialog allows the thread of the dialog at least. Nothing here throws.
class KT_PUBLIC_API IKTGeneralProgressCallBack {
  public:
    IKTGeneralProgressCallBack();
    IKTGeneralProgressCallBack(IKTGeneralProgressCallBack const &other);
    IKTGeneralProgressCallBack &operator=(IKTGeneralProgressCallBack const &other);
    virtual ~IKTGeneralProgressCallBack();

    /// An operation begins; `title` names it for the user. Range 0 to 0, position 0, no message, not cancelled.
    virtual void Begin(KTString const &title) = 0;

    /// The operation has ended, successfully or not; nothing more is reported until the next Begin.
    virtual void End(KTErrorCodeEnum result) = 0;

    /// The position runs from `first` to `last`, in units of the caller's choice: bytes, files. Equal numbers mean that
    /// it is not known how much there is to do.
    virtual void SetRange(KTUInt64 first, KTUInt64 last) = 0;

    /// The operation has got there; positions outside the range count as its nearer end.
    virtual void SetPosition(KTUInt64 position) = 0;

    /// The operation has got that much further.
    virtual void Advance(KTUInt64 amount) = 0;

    /// The position that was reported last.
    virtual KTUInt64 GetPosition() const = 0;

    /// What is being done right now, for the user.
    virtual void SetMessage(KTString const &message) = 0;

    /// Whether the user may cancel the operation; 1 at first.
    virtual void SetCancellable(KTBool16 cancellable) = 0;

    /// Asks the operation to stop, as the user wants; without effect while it may not be cancelled.
    virtual void Cancel() = 0;

    /// 1 once the operation is to stop, else 0. The operation asks this between its steps, and then undoes or leaves
    /// what it has done, as it has promised its caller.
    virtual KTBool16 IsCancelled() const = 0;

    /// Lets the host handle what waits for it, such as repainting; called between steps that take long.
    virtual void HandleEvents() = 0;
};

#include "KTEndExports.h"
