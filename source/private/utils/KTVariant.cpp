// KTVariant.cpp: variants, whose maps may nest deeper than the stack could follow.
//
// Copying, comparing and destroying therefore never call themselves for a nested map. Each keeps the maps that are still
// to be done in a list: the copy and the comparison in a vector, the destruction, which must not fail, in a chain through
// the maps themselves.

#include "KTVariant.h"

#include "KTAssert.h"

#include <utility>
#include <vector>

namespace {

constexpr char kPath[] = "source/private/utils/KTVariant";
constexpr char kWrongType[] = "Accessing wrong type in variant";
constexpr char kWrongTypeCapital[] = "Accessing Wrong type in variant"; // some getters spell it so

} // namespace

// ---- maps ----

struct KTVariant::Children {
    Map entries;
    Children *next = nullptr; // the chain of those to be destroyed
};

void KTVariant::DeleteChildren::operator()(Children *children) const noexcept {
    while (children != nullptr) {
        Children *const current = children;
        children = current->next;
        for (auto &[name, variant] : current->entries) {
            for (OwnedChildren *const nested : {&variant.m_Object, &variant.m_AssocArray}) {
                if (*nested != nullptr) {
                    (*nested)->next = children;
                    children = nested->release();
                }
            }
        }
        delete current; // its variants have no maps any more
    }
}

KTVariant::OwnedChildren KTVariant::CopyOf(Map const &map) {
    struct Task {
        Map const *from;
        OwnedChildren *to;
    };
    OwnedChildren root;
    std::vector<Task> tasks = {{&map, &root}};
    while (!tasks.empty()) {
        Task const task = tasks.back();
        tasks.pop_back();
        if (task.from->empty()) {
            continue;
        }
        task.to->reset(new Children);
        Map &entries = (*task.to)->entries;
        for (auto const &[name, variant] : *task.from) {
            KTVariant &copy = entries.try_emplace(entries.end(), name)->second;
            copy.CopyPlainValues(variant);
            if (variant.m_Object != nullptr) {
                tasks.push_back({&variant.m_Object->entries, &copy.m_Object});
            }
            if (variant.m_AssocArray != nullptr) {
                tasks.push_back({&variant.m_AssocArray->entries, &copy.m_AssocArray});
            }
        }
    }
    return root;
}

KTVariant::OwnedChildren KTVariant::Take(Map &&map) {
    OwnedChildren children;
    if (!map.empty()) {
        children.reset(new Children);
        children->entries = std::move(map);
    }
    return children;
}

KTVariant::Map const &KTVariant::EntriesOf(OwnedChildren const &children) {
    static Map const empty;
    if (children == nullptr) {
        return empty;
    }
    return children->entries;
}

// ---- construction ----

KTVariant::KTVariant() = default;
KTVariant::KTVariant(bool value) : m_Type(kBool), m_Bool(value) {}
KTVariant::KTVariant(int value) : m_Type(kInt), m_Int(value) {}
KTVariant::KTVariant(double value) : m_Type(kDouble), m_Double(value) {}
KTVariant::KTVariant(void *value) : m_Type(kVoidPtr), m_VoidPtr(value) {}
KTVariant::KTVariant(KTString const &value) : m_Type(kString), m_String(value) {}
KTVariant::KTVariant(KTColor const &value) : m_Type(kColor), m_Color(std::make_unique<KTColor>(value)) {}
KTVariant::KTVariant(KTShortCut const &value) : m_Type(kShortCut), m_ShortCut(std::make_unique<KTShortCut>(value)) {}

KTVariant::KTVariant(KTVariant const &other) {
    CopyPlainValues(other);
    m_Object = CopyOf(EntriesOf(other.m_Object));
    m_AssocArray = CopyOf(EntriesOf(other.m_AssocArray));
}

KTVariant::KTVariant(KTVariant &&other) noexcept { Swap(other); }

// The other one may stand in this one's maps: what was here goes last.
KTVariant &KTVariant::operator=(KTVariant const &other) {
    KTVariant copy(other);
    Swap(copy);
    return *this;
}

KTVariant &KTVariant::operator=(KTVariant &&other) noexcept {
    KTVariant taken(std::move(other));
    Swap(taken);
    return *this;
}

KTVariant::~KTVariant() = default;

// Everything but the maps, which must be empty here.
void KTVariant::CopyPlainValues(KTVariant const &other) {
    m_Type = other.m_Type;
    m_Int = other.m_Int;
    m_Bool = other.m_Bool;
    m_Double = other.m_Double;
    m_VoidPtr = other.m_VoidPtr;
    m_String = other.m_String;
    m_Class = other.m_Class;
    m_Color = other.m_Color != nullptr ? std::make_unique<KTColor>(*other.m_Color) : nullptr;
    m_ShortCut = other.m_ShortCut != nullptr ? std::make_unique<KTShortCut>(*other.m_ShortCut) : nullptr;
}

void KTVariant::Swap(KTVariant &other) noexcept {
    std::swap(m_Type, other.m_Type);
    std::swap(m_Int, other.m_Int);
    std::swap(m_Bool, other.m_Bool);
    std::swap(m_Double, other.m_Double);
    std::swap(m_VoidPtr, other.m_VoidPtr);
    m_String.swap(other.m_String);
    m_Class.swap(other.m_Class);
    m_Color.swap(other.m_Color);
    m_ShortCut.swap(other.m_ShortCut);
    m_Object.swap(other.m_Object);
    m_AssocArray.swap(other.m_AssocArray);
}

KTVariant::KTVariantType KTVariant::Type() const { return m_Type; }

// ---- setters ----

// What is owned for another kind goes.
KTErrorCodeEnum KTVariant::SetType(KTVariantType type) {
    m_Type = type;
    if (type != kColor) {
        m_Color.reset();
    }
    if (type != kShortCut) {
        m_ShortCut.reset();
    }
    return kKTErrorNone;
}

KTErrorCodeEnum KTVariant::SetString(KTString const &value) {
    m_String = value;
    return SetType(kString);
}

KTErrorCodeEnum KTVariant::SetDouble(double value) {
    m_Double = value;
    return SetType(kDouble);
}

KTErrorCodeEnum KTVariant::SetInt(int const &value) {
    m_Int = value;
    return SetType(kInt);
}

KTErrorCodeEnum KTVariant::SetBool(unsigned char value) {
    m_Bool = value != 0;
    return SetType(kBool);
}

KTErrorCodeEnum KTVariant::SetVoidPtr(void *value) {
    m_VoidPtr = value;
    return SetType(kVoidPtr);
}

KTErrorCodeEnum KTVariant::SetDate(int value) {
    m_Int = value;
    return SetType(kDate);
}

KTErrorCodeEnum KTVariant::SetClass(KTString value) {
    m_Class.swap(value);
    return SetType(kClass);
}

KTErrorCodeEnum KTVariant::SetObject(std::map<KTString, KTVariant> const &value) {
    m_Object = CopyOf(value);
    return SetType(kObject);
}

KTErrorCodeEnum KTVariant::SetObject(std::map<KTString, KTVariant> &&value) {
    m_Object = Take(std::move(value));
    return SetType(kObject);
}

KTErrorCodeEnum KTVariant::SetAssocArray(std::map<KTString, KTVariant> const &value) {
    m_AssocArray = CopyOf(value);
    return SetType(kAssocArray);
}

KTErrorCodeEnum KTVariant::SetAssocArray(std::map<KTString, KTVariant> &&value) {
    m_AssocArray = Take(std::move(value));
    return SetType(kAssocArray);
}

KTErrorCodeEnum KTVariant::SetUndefined() { return SetType(kUndefined); }

KTErrorCodeEnum KTVariant::SetColor(KTColor const &value) {
    m_Color = std::make_unique<KTColor>(value);
    return SetType(kColor);
}

KTErrorCodeEnum KTVariant::SetShortCut(KTShortCut const &value) {
    m_ShortCut = std::make_unique<KTShortCut>(value);
    return SetType(kShortCut);
}

// ---- getters ----

void KTVariant::Expect(KTVariantType type, char const *message, KTInt32 line) const {
    if (m_Type != type) {
        KTAssertFailed(message, kPath, line);
    }
}

KTString const &KTVariant::GetString() const {
    Expect(kString, kWrongType, 127);
    return m_String;
}

double KTVariant::GetDouble() const {
    Expect(kDouble, kWrongType, 138);
    return m_Double;
}

int KTVariant::GetInt() const {
    Expect(kInt, kWrongType, 155);
    return m_Int;
}

unsigned char KTVariant::GetBool() const {
    Expect(kBool, kWrongType, 172);
    return m_Bool ? 1 : 0;
}

void *KTVariant::GetVoidPtr() const {
    Expect(kVoidPtr, kWrongType, 189);
    return m_VoidPtr;
}

int KTVariant::GetDate() const {
    Expect(kDate, kWrongTypeCapital, 206);
    return m_Int;
}

KTString KTVariant::GetClass() const {
    Expect(kClass, kWrongTypeCapital, 230);
    return m_Class;
}

std::map<KTString, KTVariant> const &KTVariant::GetObject() const {
    Expect(kObject, kWrongTypeCapital, 247);
    return EntriesOf(m_Object);
}

std::map<KTString, KTVariant> const &KTVariant::GetAssocArray() const {
    Expect(kAssocArray, kWrongTypeCapital, 264);
    return EntriesOf(m_AssocArray);
}

KTColor const &KTVariant::GetColor() const {
    Expect(kColor, kWrongType, 288);
    if (m_Color == nullptr) {
        static KTColor const none;
        KTAssertFailed("", kPath, 293);
        return none;
    }
    return *m_Color;
}

KTShortCut const &KTVariant::GetShortCut() const {
    Expect(kShortCut, kWrongType, 310);
    if (m_ShortCut == nullptr) {
        static KTShortCut const none;
        KTAssertFailed("", kPath, 315);
        return none;
    }
    return *m_ShortCut;
}

// ---- comparison ----

KTBool16 KTVariant::operator==(KTVariant const &other) const { return AreEqual(*this, other) ? 1 : 0; }

KTBool16 KTVariant::operator!=(KTVariant const &other) const { return AreEqual(*this, other) ? 0 : 1; }

bool KTVariant::IsMap() const { return m_Type == kObject || m_Type == kAssocArray; }

// Depth first, entry by entry, up to the first difference.
bool KTVariant::AreEqual(KTVariant const &a, KTVariant const &b) {
    struct Level {
        Map::const_iterator a;
        Map::const_iterator end;
        Map::const_iterator b;
    };
    std::vector<Level> levels;
    auto const compare = [&levels](KTVariant const &one, KTVariant const &other) {
        if (one.m_Type != other.m_Type) {
            return false;
        }
        if (!one.IsMap()) {
            return one.HasEqualPlainValue(other);
        }
        bool const isObject = one.m_Type == kObject;
        Map const &map = EntriesOf(isObject ? one.m_Object : one.m_AssocArray);
        Map const &otherMap = EntriesOf(isObject ? other.m_Object : other.m_AssocArray);
        if (map.size() != otherMap.size()) {
            return false;
        }
        if (!map.empty()) {
            levels.push_back({map.begin(), map.end(), otherMap.begin()});
        }
        return true;
    };
    bool isEqual = compare(a, b);
    while (isEqual && !levels.empty()) {
        Level &level = levels.back();
        auto const entry = level.a++;
        auto const other = level.b++;
        if (level.a == level.end) {
            levels.pop_back();
        }
        isEqual = entry->first == other->first && compare(entry->second, other->second);
    }
    return isEqual;
}

// REQUIRES: the same kind, which is no map.
bool KTVariant::HasEqualPlainValue(KTVariant const &other) const {
    switch (m_Type) {
    case kBool:
        return m_Bool == other.m_Bool;
    case kClass:
        return m_Class == other.m_Class;
    case kColor:
        return *m_Color == *other.m_Color;
    case kDate:
    case kInt:
        return m_Int == other.m_Int;
    case kDouble:
        return m_Double == other.m_Double;
    case kShortCut:
        return *m_ShortCut == *other.m_ShortCut;
    case kString:
        return m_String == other.m_String;
    case kUndefined:
        return true;
    case kVoidPtr:
        return m_VoidPtr == other.m_VoidPtr;
    default:
        KTAssertFailed("Unknown Data Type in Variant", kPath, 399);
        return false;
    }
}
