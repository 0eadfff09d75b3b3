// IKTStringDictionary.h: texts by key, as the application looks up what its users see.

#pragma once

#include "KTErrorCodes.h"
#include "KTFile.h"
#include "KTString.h"

#include "KTBeginExports.h"

/// Maps localisation keys to UTF-16 texts. KTStringDictionary is the library's own and says what each operation does;
/// KTPublicUtils::GetStringDictionary gives the process-wide one. Slots stand in the order of their declaration.
///
/// Not locked: a dictionary is filled on one thread, at start-up; then any number of threads may look texts up.
class KT_PUBLIC_API IKTStringDictionary {
  public:
    virtual ~IKTStringDictionary();

    /// Stores the text under the key, replacing one that is there.
    virtual KTErrorCodeEnum AddString(KTString const &key, KTString const &value) = 0;

    /// The same with UTF-8; kKTErrorFailed if either is null.
    virtual KTErrorCodeEnum AddString(char const *key, char const *value) = 0;

    /// The text of the key, or its default, or an empty string.
    virtual KTString GetKeyValue(KTString const &key) = 0;

    /// Writes a new file in the binary or the text form.
    virtual KTErrorCodeEnum WriteToFile(KTFile const &file, bool binary) = 0;

    /// Adds what a file of any form holds.
    virtual KTErrorCodeEnum ReadFromFile(KTFile const &file) = 0;

  protected:
    IKTStringDictionary();
    IKTStringDictionary(IKTStringDictionary const &);
    IKTStringDictionary &operator=(IKTStringDictionary const &);
};

#include "KTEndExports.h"
