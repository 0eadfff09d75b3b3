// KTVariant.h: a property's value of one of twelve kinds.
//
//     std::map<KTString, KTVariant> page;
//     page["Title"] = KTVariant(KTString("Quay"));
//     page["Width"] = KTVariant(1024);
//     KTVariant course;
//     course.SetObject(page);
//     if (course.Type() == KTVariant::kObject)
//         course.GetObject().at("Width").GetInt();
//
// A variant keeps one value for each kind beside the tag that says which counts; integers and dates share theirs. A
// setter changes its own value and the tag, and the owned colour and shortcut are freed when another kind is set; the
// other values stay. Reading another kind than the tag's is reported as an assertion and gives what is kept there: what
// was set last, or 0, false, null, empty, opaque black or no shortcut.
//
// Maps nest as deep as memory allows: copying, comparing and destroying take a fixed amount of stack. Copies copy all
// that is in a map, so a map that is no longer needed is better moved: `course.SetObject(std::move(page))`.
//
// WRONG: KTVariant("text"). Byte and wide texts do not compile, as the language would make a bool or an address of them.
//
// Threads: different variants may be used on different threads; one variant is not locked. Reading one from several
// threads at a time is safe while none changes it. Setters, copies and comparisons throw std::bad_alloc when memory is
// short; a variant that was to be changed then holds what it held before.

#pragma once

#include "KTColor.h"
#include "KTErrorCodes.h"
#include "KTShortCut.h"
#include "KTString.h"
#include "KTTypes.h"

#include <concepts>
#include <map>
#include <memory>
#include <type_traits>

#include "KTBeginExports.h"

// The system's header makes a macro of this name, of one letter more. Here it names our member in either order.
#pragma push_macro("GetObject")
#undef GetObject

/// A tagged value. See the top of this file.
class KT_PUBLIC_API KTVariant {
  public:
    /// Which value counts.
    enum KTVariantType : int {
        kAssocArray = 0, ///< a map, as scripts know associative arrays
        kBool = 1,
        kClass = 2, ///< the name of a class
        kColor = 3,
        kDate = 4, ///< a number; its unit is the caller's
        kDouble = 5,
        kInt = 6,
        kObject = 7, ///< a map: the properties of an object
        kShortCut = 8,
        kString = 9,
        kUndefined = 10,
        kVoidPtr = 11 ///< an address that the variant does not own
    };

    /// Ordered by the names, as KTString compares them.
    using Map = std::map<KTString, KTVariant>;

    /// Undefined.
    KTVariant();

    KTVariant(bool value);
    KTVariant(int value);
    KTVariant(double value);
    KTVariant(void *value);
    KTVariant(KTString const &value);
    KTVariant(KTColor const &value);
    KTVariant(KTShortCut const &value);

    /// Texts in other forms, for which KTVariant(KTString("text")) is meant, and pointers to constants, which would
    /// become a bool.
    template <typename T>
        requires std::is_const_v<T> || std::same_as<T, char> || std::same_as<T, wchar_t> ||
                     std::same_as<T, unsigned short>
    KTVariant(T *) = delete;

    /// Copies all values, those of other kinds than the tag's too.
    KTVariant(KTVariant const &other);
    KTVariant &operator=(KTVariant const &other);

    /// Takes all values over; the other variant is undefined and empty then.
    KTVariant(KTVariant &&other) noexcept;
    KTVariant &operator=(KTVariant &&other) noexcept;

    ~KTVariant();

    /// The kind.
    KTVariantType Type() const;

    // ---- setters: the value and its kind; each returns kKTErrorNone ----
    //
    // A value may come from the variant itself, also from deep in its own maps.

    KTErrorCodeEnum SetString(KTString const &value);
    KTErrorCodeEnum SetDouble(double value);
    KTErrorCodeEnum SetInt(int const &value);

    /// Anything but 0 is true.
    KTErrorCodeEnum SetBool(unsigned char value);

    KTErrorCodeEnum SetVoidPtr(void *value);
    KTErrorCodeEnum SetDate(int value);
    KTErrorCodeEnum SetClass(KTString value);
    KTErrorCodeEnum SetObject(std::map<KTString, KTVariant> const &value);
    KTErrorCodeEnum SetObject(std::map<KTString, KTVariant> &&value);
    KTErrorCodeEnum SetAssocArray(std::map<KTString, KTVariant> const &value);
    KTErrorCodeEnum SetAssocArray(std::map<KTString, KTVariant> &&value);
    KTErrorCodeEnum SetUndefined();
    KTErrorCodeEnum SetColor(KTColor const &value);
    KTErrorCodeEnum SetShortCut(KTShortCut const &value);

    // ---- getters ----
    //
    // References stay valid until the variant is changed or destroyed. Another kind than the one asked for is reported
    // as the assertion "Accessing wrong type in variant"; a colour or shortcut that is not there is reported once more.

    KTString const &GetString() const;
    double GetDouble() const;
    int GetInt() const;

    /// 1 or 0.
    unsigned char GetBool() const;

    void *GetVoidPtr() const;
    int GetDate() const;
    KTString GetClass() const;
    std::map<KTString, KTVariant> const &GetObject() const;
    std::map<KTString, KTVariant> const &GetAssocArray() const;
    KTColor const &GetColor() const;
    KTShortCut const &GetShortCut() const;

    /// GetObject by the names that the system's macro makes of it in callers that include <windows.h>.
    std::map<KTString, KTVariant> const &GetObjectW() const { return GetObject(); }
    std::map<KTString, KTVariant> const &GetObjectA() const { return GetObject(); }

    /// 1 when the kinds and the values of that kind are the same, else 0. Doubles compare as numbers, so NaN equals
    /// nothing; colours, shortcuts and strings by their own ==; addresses as such; maps when they have the same names
    /// with equal variants. Undefined equals undefined. A tag that is none of the twelve is reported as the assertion
    /// "Unknown Data Type in Variant" and equals nothing.
    KTBool16 operator==(KTVariant const &other) const;
    KTBool16 operator!=(KTVariant const &other) const;

  private:
    struct Children; // a map of variants
    struct DeleteChildren {
        void operator()(Children *children) const noexcept;
    };
    using OwnedChildren = std::unique_ptr<Children, DeleteChildren>; // null for an empty map

    static OwnedChildren CopyOf(Map const &map);
    static OwnedChildren Take(Map &&map);
    static Map const &EntriesOf(OwnedChildren const &children);
    static bool AreEqual(KTVariant const &a, KTVariant const &b);

    void CopyPlainValues(KTVariant const &other);
    void Swap(KTVariant &other) noexcept;
    KTErrorCodeEnum SetType(KTVariantType type);
    void Expect(KTVariantType type, char const *message, KTInt32 line) const;
    bool IsMap() const;
    bool HasEqualPlainValue(KTVariant const &other) const;

    KTVariantType m_Type = kUndefined;
    int m_Int = 0; // integers and dates
    bool m_Bool = false;
    double m_Double = 0.0;
    void *m_VoidPtr = nullptr;
    KTString m_String;
    KTString m_Class;
    std::unique_ptr<KTColor> m_Color;
    std::unique_ptr<KTShortCut> m_ShortCut;
    OwnedChildren m_Object;
    OwnedChildren m_AssocArray;
};

#pragma pop_macro("GetObject")

#include "KTEndExports.h"
