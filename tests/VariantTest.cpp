// VariantTest.cpp: variants: every kind set, read, copied and compared; reading the wrong kind; deep and wide maps; values
// that come from the variant itself.

#include "KTVariant.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <functional>
#include <limits>
#include <random>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace {

using Lines = std::vector<std::string>;
using Map = std::map<KTString, KTVariant>;
using Type = KTVariant::KTVariantType;

constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr KTUInt32 kRed = 0xFFFF0000;
constexpr int kDeep = 100'000; // levels: far more than any stack of the tests would hold
constexpr Type kUnknownType = static_cast<Type>(12);

int theTarget = 0; // something to point at

KTShortCut Save() { return {kKTShortCutCtrl, static_cast<KTShortCutKey>('S')}; }
KTVariant Text(char const *text) { return {KTString(text)}; }

template <typename Set> KTVariant Made(Set set) {
    KTVariant variant;
    EXPECT_EQ(set(variant), kKTErrorNone);
    return variant;
}

// Two different values of each kind.
std::vector<std::pair<KTVariant, KTVariant>> Samples() {
    Map const one = {{"a", KTVariant(1)}};
    Map const other = {{"a", KTVariant(2)}};
    auto const assocArray = [](Map const &map) { return Made([&](auto &v) { return v.SetAssocArray(map); }); };
    auto const object = [](Map const &map) { return Made([&](auto &v) { return v.SetObject(map); }); };
    auto const name = [](char const *text) { return Made([&](auto &v) { return v.SetClass(text); }); };
    auto const date = [](int day) { return Made([&](auto &v) { return v.SetDate(day); }); };
    return {{assocArray(one), assocArray(other)},
            {KTVariant(true), KTVariant(false)},
            {name("Page"), name("Quiz")},
            {KTVariant(KTColor(kRed)), KTVariant(KTColor(0xFF00FF00))},
            {date(20261121), date(20261122)},
            {KTVariant(1.5), KTVariant(2.5)},
            {KTVariant(7), KTVariant(8)},
            {object(one), object(other)},
            {KTVariant(Save()), KTVariant(KTShortCut(65))},
            {Text("x"), Text("y")},
            {KTVariant(), KTVariant()},
            {KTVariant(&theTarget), KTVariant(static_cast<void *>(nullptr))}};
}

// `depth` maps inside one another, `innermost` in the last.
KTVariant Nested(int depth, KTVariant innermost) {
    for (int level = 0; level < depth; ++level) {
        Map map;
        map["next"] = std::move(innermost);
        innermost = KTVariant();
        if (level % 2 == 0) {
            innermost.SetObject(std::move(map));
        } else {
            innermost.SetAssocArray(std::move(map));
        }
    }
    return innermost;
}

int DepthOf(KTVariant const &variant) {
    int depth = 0;
    for (KTVariant const *at = &variant;; ++depth) {
        if (at->Type() == KTVariant::kObject) {
            at = &at->GetObject().at("next");
        } else if (at->Type() == KTVariant::kAssocArray) {
            at = &at->GetAssocArray().at("next");
        } else {
            return depth;
        }
    }
}

void SetTag(KTVariant &variant, Type type) { std::memcpy(static_cast<void *>(&variant), &type, sizeof type); }

std::string Report(std::string const &message, int line) {
    return "Assert failed: " + message + " at source/private/utils/KTVariant:" + std::to_string(line);
}

} // namespace

// ---- kinds ----

TEST(Variant, TagsAreFixed) {
    EXPECT_EQ(KTVariant::kAssocArray, 0);
    EXPECT_EQ(KTVariant::kBool, 1);
    EXPECT_EQ(KTVariant::kClass, 2);
    EXPECT_EQ(KTVariant::kColor, 3);
    EXPECT_EQ(KTVariant::kDate, 4);
    EXPECT_EQ(KTVariant::kDouble, 5);
    EXPECT_EQ(KTVariant::kInt, 6);
    EXPECT_EQ(KTVariant::kObject, 7);
    EXPECT_EQ(KTVariant::kShortCut, 8);
    EXPECT_EQ(KTVariant::kString, 9);
    EXPECT_EQ(KTVariant::kUndefined, 10);
    EXPECT_EQ(KTVariant::kVoidPtr, 11);
    EXPECT_EQ(sizeof(Type), 4U);
    auto const samples = Samples();
    ASSERT_EQ(samples.size(), 12U);
    for (std::size_t tag = 0; tag < samples.size(); ++tag) {
        EXPECT_EQ(samples[tag].first.Type(), static_cast<Type>(tag));
        EXPECT_EQ(samples[tag].second.Type(), static_cast<Type>(tag));
    }
}

TEST(Variant, ConstructorsKeepTheirValue) {
    LogLines log;
    EXPECT_EQ(KTVariant().Type(), KTVariant::kUndefined);
    EXPECT_EQ(KTVariant(true).GetBool(), 1);
    EXPECT_EQ(KTVariant(false).GetBool(), 0);
    EXPECT_EQ(KTVariant(INT_MIN).GetInt(), INT_MIN);
    EXPECT_EQ(KTVariant(0.25).GetDouble(), 0.25);
    EXPECT_EQ(KTVariant(&theTarget).GetVoidPtr(), &theTarget);
    EXPECT_EQ(KTVariant(KTString("text")).GetString(), "text");
    EXPECT_EQ(KTVariant(KTColor(kRed)).GetColor().GetColorAsUInt(), kRed);
    EXPECT_EQ(KTVariant(Save()).GetShortCut(), Save());
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Variant, SettersKeepTheirValueAndKind) {
    LogLines log;
    KTVariant v;
    EXPECT_EQ(v.SetBool(1), kKTErrorNone);
    EXPECT_EQ(v.GetBool(), 1);
    EXPECT_EQ(v.SetBool(0), kKTErrorNone);
    EXPECT_EQ(v.GetBool(), 0);
    EXPECT_EQ(v.SetBool(200), kKTErrorNone);
    EXPECT_EQ(v.GetBool(), 1) << "anything but 0 is true";
    EXPECT_EQ(v.SetInt(-5), kKTErrorNone);
    EXPECT_EQ(v.GetInt(), -5);
    EXPECT_EQ(v.SetDate(INT_MAX), kKTErrorNone);
    EXPECT_EQ(v.GetDate(), INT_MAX);
    EXPECT_EQ(v.SetDouble(-0.5), kKTErrorNone);
    EXPECT_EQ(v.GetDouble(), -0.5);
    EXPECT_EQ(v.SetVoidPtr(&theTarget), kKTErrorNone);
    EXPECT_EQ(v.GetVoidPtr(), &theTarget);
    EXPECT_EQ(v.SetString("text"), kKTErrorNone);
    EXPECT_EQ(v.GetString(), "text");
    EXPECT_EQ(v.SetClass("Page"), kKTErrorNone);
    EXPECT_EQ(v.GetClass(), "Page");
    EXPECT_EQ(v.SetColor(KTColor(kRed)), kKTErrorNone);
    EXPECT_EQ(v.GetColor().GetColorAsUInt(), kRed);
    EXPECT_EQ(v.SetShortCut(Save()), kKTErrorNone);
    EXPECT_EQ(v.GetShortCut(), Save());
    Map const map = {{"b", Text("2")}, {"a", KTVariant(1)}};
    EXPECT_EQ(v.SetObject(map), kKTErrorNone);
    EXPECT_EQ(v.GetObject().begin()->first, "a") << "ordered by name";
    EXPECT_EQ(v.GetObject().at("b").GetString(), "2");
    EXPECT_EQ(v.SetAssocArray(map), kKTErrorNone);
    EXPECT_EQ(v.GetAssocArray().at("a").GetInt(), 1);
    EXPECT_EQ(v.SetObject(Map()), kKTErrorNone);
    EXPECT_TRUE(v.GetObject().empty());
    EXPECT_EQ(v.SetAssocArray(Map()), kKTErrorNone);
    EXPECT_TRUE(v.GetAssocArray().empty());
    EXPECT_EQ(v.SetUndefined(), kKTErrorNone);
    EXPECT_EQ(v.Type(), KTVariant::kUndefined);
    EXPECT_EQ(log.Take(), Lines{});
}

TEST(Variant, TextsInOtherFormsDoNotCompile) {
    EXPECT_FALSE((std::is_constructible_v<KTVariant, char const *>));
    EXPECT_FALSE((std::is_constructible_v<KTVariant, char *>));
    EXPECT_FALSE((std::is_constructible_v<KTVariant, wchar_t const *>));
    EXPECT_FALSE((std::is_constructible_v<KTVariant, unsigned short const *>));
    EXPECT_FALSE((std::is_constructible_v<KTVariant, int const *>)) << "would be a bool";
    EXPECT_FALSE((std::is_constructible_v<KTVariant, void const *>));
    EXPECT_FALSE((std::is_constructible_v<KTVariant, long long>)) << "would be cut";
    EXPECT_EQ(KTVariant(&theTarget).Type(), KTVariant::kVoidPtr);
    EXPECT_EQ(KTVariant(nullptr).Type(), KTVariant::kVoidPtr);
}

TEST(Variant, IntegersAndDatesShareTheirValue) {
    LogLines log;
    KTVariant v(5);
    EXPECT_EQ(v.GetDate(), 5);
    v.SetDate(6);
    EXPECT_EQ(v.GetInt(), 6);
    EXPECT_EQ(log.Take().size(), 2U);
}

// ---- the wrong kind ----

// Each getter on each other kind: one report, and the getter's own value all the same.
TEST(Variant, TheWrongKindIsReportedAndTheValueGiven) {
    struct Getter {
        Type type;
        std::function<void(KTVariant const &)> read;
        Lines reports;
    };
    std::string const wrong = "Accessing wrong type in variant";
    std::string const capital = "Accessing Wrong type in variant";
    std::vector<Getter> const getters = {
        {KTVariant::kString, [](auto &v) { EXPECT_EQ(v.GetString(), "s"); }, {Report(wrong, 127)}},
        {KTVariant::kDouble, [](auto &v) { EXPECT_EQ(v.GetDouble(), 1.5); }, {Report(wrong, 138)}},
        {KTVariant::kInt, [](auto &v) { EXPECT_EQ(v.GetInt(), 7); }, {Report(wrong, 155)}},
        {KTVariant::kBool, [](auto &v) { EXPECT_EQ(v.GetBool(), 1); }, {Report(wrong, 172)}},
        {KTVariant::kVoidPtr, [](auto &v) { EXPECT_EQ(v.GetVoidPtr(), &theTarget); }, {Report(wrong, 189)}},
        {KTVariant::kDate, [](auto &v) { EXPECT_EQ(v.GetDate(), 7); }, {Report(capital, 206)}},
        {KTVariant::kClass, [](auto &v) { EXPECT_EQ(v.GetClass(), "c"); }, {Report(capital, 230)}},
        {KTVariant::kObject, [](auto &v) { EXPECT_EQ(v.GetObject().count("o"), 1U); }, {Report(capital, 247)}},
        {KTVariant::kAssocArray, [](auto &v) { EXPECT_EQ(v.GetAssocArray().count("a"), 1U); }, {Report(capital, 264)}},
        {KTVariant::kColor,
         [](auto &v) { EXPECT_TRUE(v.GetColor() == KTColor()); },
         {Report(wrong, 288), Report("", 293)}},
        {KTVariant::kShortCut,
         [](auto &v) { EXPECT_TRUE(v.GetShortCut().IsNoShortCut()); },
         {Report(wrong, 310), Report("", 315)}}};
    for (auto const &[sample, other] : Samples()) {
        KTVariant v;
        v.SetString("s");
        v.SetDouble(1.5);
        v.SetBool(1);
        v.SetVoidPtr(&theTarget);
        v.SetDate(7);
        v.SetClass("c");
        v.SetObject(Map{{"o", KTVariant()}});
        v.SetAssocArray(Map{{"a", KTVariant()}});
        Type const type = sample.Type();
        SetTag(v, type); // the kind alone
        for (Getter const &getter : getters) {
            if (getter.type != type) {
                LogLines log;
                getter.read(v);
                EXPECT_EQ(log.Take(), getter.reports) << "getter of " << getter.type << " on " << type;
            }
        }
        SetTag(v, KTVariant::kUndefined);
    }
}

TEST(Variant, NeverSetValuesAreEmpty) {
    KTVariant const v;
    EXPECT_EQ(v.GetString(), "");
    EXPECT_EQ(v.GetDouble(), 0.0);
    EXPECT_EQ(v.GetInt(), 0);
    EXPECT_EQ(v.GetBool(), 0);
    EXPECT_EQ(v.GetVoidPtr(), nullptr);
    EXPECT_EQ(v.GetDate(), 0);
    EXPECT_EQ(v.GetClass(), "");
    EXPECT_TRUE(v.GetObject().empty());
    EXPECT_TRUE(v.GetAssocArray().empty());
}

TEST(Variant, ColoursAndShortCutsAreFreedWhenTheKindChanges) {
    KTVariant v{KTColor(kRed)};
    v.SetInt(1);
    LogLines log;
    EXPECT_TRUE(v.GetColor() == KTColor());
    EXPECT_EQ(log.Take(), (Lines{Report("Accessing wrong type in variant", 288), Report("", 293)}));
    v.SetShortCut(Save());
    v.SetColor(KTColor(kRed));
    EXPECT_TRUE(v.GetShortCut().IsNoShortCut());
    EXPECT_EQ(log.Take(), (Lines{Report("Accessing wrong type in variant", 310), Report("", 315)}));
    v.SetShortCut(Save());
    EXPECT_TRUE(v.GetColor() == KTColor());
    EXPECT_EQ(log.Take().size(), 2U);
    v.SetUndefined();
    v.GetShortCut();
    EXPECT_EQ(log.Take().size(), 2U);
}

// ---- copies and comparison ----

TEST(Variant, EqualsItsCopyAndNothingElse) {
    auto const samples = Samples();
    for (std::size_t i = 0; i < samples.size(); ++i) {
        auto const &[one, other] = samples[i];
        bool const isUndefined = one.Type() == KTVariant::kUndefined;
        KTVariant const copy(one);
        KTVariant assigned(7);
        assigned = one;
        EXPECT_TRUE(one == copy) << i;
        EXPECT_TRUE(one == assigned) << i;
        EXPECT_FALSE(one != copy) << i;
        EXPECT_EQ(one == other, isUndefined ? 1 : 0) << i;
        EXPECT_EQ(one != other, isUndefined ? 0 : 1) << i;
        for (std::size_t k = 0; k < samples.size(); ++k) {
            EXPECT_EQ(one == samples[k].first, i == k ? 1 : 0) << i << " and " << k;
        }
    }
    EXPECT_TRUE((std::is_same_v<KTBool16, decltype(KTVariant() == KTVariant())>));
    EXPECT_TRUE((std::is_same_v<KTBool16, decltype(KTVariant() != KTVariant())>));
}

TEST(Variant, CopiesOwnWhatTheyHold) {
    KTVariant original{KTColor(kRed)};
    KTVariant const colour(original);
    original.SetShortCut(Save());
    KTVariant const shortCut(original);
    original.SetObject(Map{{"a", Text("x")}});
    KTVariant const object(original);
    original.SetUndefined();
    original = KTVariant();
    EXPECT_EQ(colour.GetColor().GetColorAsUInt(), kRed);
    EXPECT_EQ(shortCut.GetShortCut(), Save());
    EXPECT_EQ(object.GetObject().at("a").GetString(), "x");
}

TEST(Variant, MovedFromIsUndefined) {
    for (auto const &[sample, other] : Samples()) {
        KTVariant source(sample);
        KTVariant const moved(std::move(source));
        EXPECT_TRUE(moved == sample);
        EXPECT_EQ(source.Type(), KTVariant::kUndefined); // NOLINT(bugprone-use-after-move): that is what is asked
        source = other;
        KTVariant target(sample);
        target = std::move(source);
        EXPECT_TRUE(target == other);
        EXPECT_EQ(source.Type(), KTVariant::kUndefined); // NOLINT(bugprone-use-after-move)
    }
}

TEST(Variant, NanEqualsNothing) {
    KTVariant const nan(kNan);
    EXPECT_FALSE(nan == nan); // NOLINT(misc-redundant-expression): that is what is asked
    EXPECT_TRUE(nan != nan);  // NOLINT(misc-redundant-expression)
    EXPECT_FALSE(nan == KTVariant(kNan));
    EXPECT_TRUE(KTVariant(0.0) == KTVariant(-0.0)) << "compared as numbers";
    KTVariant map;
    map.SetObject(Map{{"n", nan}});
    EXPECT_FALSE(map == map); // NOLINT(misc-redundant-expression)
}

TEST(Variant, OnlyTheValueOfTheKindCounts) {
    KTVariant one;
    one.SetString("left over");
    one.SetInt(3);
    EXPECT_TRUE(one == KTVariant(3));
    EXPECT_FALSE(KTVariant(1) == KTVariant(true));
    EXPECT_FALSE(KTVariant(1) == KTVariant(1.0));
}

TEST(Variant, MapsCompareByNamesAndValues) {
    auto const object = [](Map map) { return Made([&](auto &v) { return v.SetObject(std::move(map)); }); };
    auto const array = [](Map map) { return Made([&](auto &v) { return v.SetAssocArray(std::move(map)); }); };
    EXPECT_TRUE(object({}) == object({}));
    EXPECT_FALSE(object({}) == array({}));
    EXPECT_FALSE(object({}) == object({{"a", KTVariant(1)}}));
    EXPECT_FALSE(object({{"a", KTVariant(1)}}) == object({{"b", KTVariant(1)}}));
    EXPECT_FALSE(object({{"a", KTVariant(1)}}) == object({{"a", KTVariant(1)}, {"b", KTVariant(1)}}));
    Map const inner = {{"x", KTVariant(1)}, {"y", array({{"z", Text("deep")}})}};
    EXPECT_TRUE(object({{"m", object(inner)}, {"n", array(inner)}}) ==
                object({{"n", array(inner)}, {"m", object(inner)}}));
    Map changed(inner);
    changed["y"].SetAssocArray(Map{{"z", Text("Deep")}});
    EXPECT_FALSE(array({{"m", object(inner)}}) == array({{"m", object(changed)}}));
    EXPECT_FALSE(array({{"m", object(changed)}, {"n", KTVariant(1)}}) ==
                 array({{"m", object(inner)}, {"n", KTVariant(1)}}));
}

TEST(Variant, AnUnknownKindIsReportedAndUnequal) {
    KTVariant one;
    SetTag(one, kUnknownType);
    KTVariant const other(one);
    LogLines log;
    Lines const expected = {Report("Unknown Data Type in Variant", 399)};
    EXPECT_FALSE(one == other);
    EXPECT_EQ(log.Take(), expected);
    EXPECT_TRUE(one != other);
    EXPECT_EQ(log.Take(), expected);
    EXPECT_FALSE(one == KTVariant());
    EXPECT_EQ(log.Take(), Lines{}) << "kinds that differ are not looked at";
}

// ---- values that come from the variant itself ----

TEST(Variant, TakesItsOwnValues) {
    KTVariant v = Text("text");
    v.SetString(v.GetString());
    EXPECT_EQ(v.GetString(), "text");
    v.SetClass(v.GetString());
    EXPECT_EQ(v.GetClass(), "text");
    v.SetColor(KTColor(kRed));
    v.SetColor(v.GetColor());
    EXPECT_EQ(v.GetColor().GetColorAsUInt(), kRed);
    v.SetShortCut(Save());
    v.SetShortCut(v.GetShortCut());
    EXPECT_EQ(v.GetShortCut(), Save());
    v.SetObject(Map{{"a", KTVariant(1)}});
    v.SetObject(v.GetObject());
    v.SetAssocArray(v.GetObject());
    EXPECT_EQ(v.GetAssocArray().at("a").GetInt(), 1);
    KTVariant &itself = v;
    v = itself;
    EXPECT_EQ(v.GetAssocArray().at("a").GetInt(), 1);
    v = std::move(itself);
    EXPECT_EQ(v.GetAssocArray().at("a").GetInt(), 1);
}

TEST(Variant, TakesWhatItsOwnMapsHold) {
    KTVariant v = Nested(4, Text("inside"));
    v.SetObject(v.GetAssocArray().at("next").GetObject());
    EXPECT_EQ(DepthOf(v), 3);
    v = v.GetObject().at("next");
    EXPECT_EQ(DepthOf(v), 2);
    v = KTVariant(v.GetAssocArray().at("next"));
    EXPECT_EQ(DepthOf(v), 1);
    v = std::move(const_cast<KTVariant &>(v.GetObject().at("next")));
    EXPECT_EQ(v.GetString(), "inside");
}

// ---- depth and width ----

TEST(Variant, DeepMapsAreCopiedAssignedComparedAndDestroyed) {
    KTVariant deep = Nested(kDeep, KTVariant(1));
    EXPECT_EQ(DepthOf(deep), kDeep);
    KTVariant copy(deep);
    EXPECT_EQ(DepthOf(copy), kDeep);
    EXPECT_TRUE(deep == copy);
    EXPECT_FALSE(deep == Nested(kDeep, KTVariant(2)));
    EXPECT_FALSE(deep == Nested(kDeep - 2, KTVariant(1)));
    KTVariant assigned = Nested(kDeep, Text("old"));
    assigned = deep;
    EXPECT_TRUE(assigned == deep);
    assigned = copy.GetAssocArray().at("next");
    EXPECT_EQ(DepthOf(assigned), kDeep - 1);
    copy.SetAssocArray(deep.GetAssocArray());
    EXPECT_TRUE(copy == deep);
    copy.SetAssocArray(Map());
    Map map;
    map["deep"] = deep;
    Map const copied(map);
    EXPECT_TRUE(copied.at("deep") == deep);
}

TEST(Variant, BothMapsOfAVariantMayBeDeep) {
    KTVariant variant = Nested(kDeep, KTVariant(1));
    variant.SetObject(variant.GetAssocArray());
    KTVariant const copy(variant);
    EXPECT_TRUE(copy == variant);
    EXPECT_EQ(DepthOf(copy), kDeep);
    LogLines log;
    EXPECT_EQ(copy.GetAssocArray().size(), 1U) << "values of other kinds are copied too";
    EXPECT_EQ(log.Take().size(), 1U);
}

TEST(Variant, RandomTreesEqualTheirCopies) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    auto const samples = Samples();
    for (int round = 0; round < 200; ++round) {
        std::vector<KTVariant> nodes(1 + random() % 60);
        for (KTVariant &node : nodes) {
            Map map;
            std::size_t const count = random() % 4;
            for (std::size_t i = 0; i < count; ++i) {
                KTString name;
                name.AppendNumber(static_cast<int>(random() % 10));
                map[name] = random() % 2 == 0 ? nodes[random() % nodes.size()] : samples[random() % 12].first;
            }
            if (random() % 2 == 0) {
                node.SetObject(std::move(map));
            } else {
                node.SetAssocArray(std::move(map));
            }
            KTVariant const copy(node);
            ASSERT_TRUE(copy == node);
        }
    }
}
