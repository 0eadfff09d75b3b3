// KTStringResourceXML.h: texts of a string dictionary as a flat XML document, for programs that cannot ask it.
//
//     <root><item><ResKey>KEY</ResKey><ResVal>TEXT</ResVal></item>
//     <item><ResKey>KEY</ResKey><ResVal>TEXT</ResVal></item>
//     </root>
//
// One list of FetchOrRegString calls serves both directions: with a document it collects the texts in their present
// language, without one it registers the defaults with the dictionary.

#pragma once

#include "IKTStringDictionary.h"
#include "KTString.h"

#include "KTBeginExports.h"

/// The document: a string that grows. One thread at a time, as for any KTString.
class KT_PUBLIC_API KTStringResourceXML : public KTString {
  public:
    /// Begins with "<root>". The dictionary must outlive the document.
    explicit KTStringResourceXML(IKTStringDictionary &dictionary);

    /// Copies the text, the dictionary it asks, and whether it is finished.
    KTStringResourceXML(KTStringResourceXML const &other);
    KTStringResourceXML &operator=(KTStringResourceXML const &other) = delete;
    ~KTStringResourceXML();

    /// Appends the item of the key with the text that the dictionary's GetKeyValue gives. Both stand as they are: no
    /// character is escaped, so texts with "<" or "&" make a document that XML readers refuse. Throws KTLCException
    /// (kKTErrorInternal) after Finish, and std::bad_alloc; the text is then unchanged.
    void AddKeyValueItemToResourceXML(KTString const &key);

    /// Appends "</root>", so call it once; returns the text, which is this object.
    KTString &Finish();

    /// With `xml`, adds the key's item to it, and `value` is not looked at; without, adds the text `value` to the
    /// dictionary under the key. Both are UTF-8. A null key is an empty one in a document; the dictionary refuses null.
    /// Throws as AddKeyValueItemToResourceXML does.
    static void FetchOrRegString(IKTStringDictionary &dictionary, KTStringResourceXML *xml, char const *key,
                                 char const *value);

  private:
    IKTStringDictionary &m_Dictionary;
    bool m_IsFinished = false;
};

#include "KTEndExports.h"
