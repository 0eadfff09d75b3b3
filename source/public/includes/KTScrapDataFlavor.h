// KTScrapDataFlavor.h: what one format of clipboard data is called and which number the system gave it.
//
// A flavour is known by its name: flavours compare by it alone, so that the same format is found again although its
// numbers differ from run to run.

#pragma once

#include "KTErrorCodes.h"
#include "KTString.h"

#include "KTBeginExports.h"

/// One clipboard format. Any thread may use its own flavours; one flavour is not locked.
class KT_PUBLIC_API KTScrapDataFlavor {
  public:
    /// Identifier 101, no name, an own flavour, system format 0.
    KTScrapDataFlavor();

    /// The given identifier, name and own-flavour flag; system format 0.
    KTScrapDataFlavor(unsigned short const &id, KTString const &name, bool ownFlavor);

    /// Copies all four fields.
    KTScrapDataFlavor(KTScrapDataFlavor const &other);
    KTScrapDataFlavor &operator=(KTScrapDataFlavor const &other);

    virtual ~KTScrapDataFlavor();

    unsigned short GetID() const;

    /// The name; the reference is valid as long as the flavour.
    KTString const &GetString() const;

    /// Whether the format is the application's own, as opposed to one that other programs define too.
    bool IsKTFlavor() const;

    /// Stores that flag. Returns kKTErrorNone.
    KTErrorCodeEnum SetIsKTFlavor(bool ownFlavor);

    /// The system's number of the format (what RegisterClipboardFormatW returns); 0 until it is set.
    unsigned int GetWinFormat() const;

    /// Stores that number. Returns kKTErrorNone.
    KTErrorCodeEnum SetWinFormat(unsigned int format);

    /// Equality and order of the names; nothing else counts.
    bool operator==(KTScrapDataFlavor const &other) const;
    bool operator<(KTScrapDataFlavor const &other) const;

  private:
    unsigned short m_Id;
    KTString m_Name;
    bool m_OwnFlavor;
    unsigned int m_WinFormat = 0;
};

#include "KTEndExports.h"
