#include "KVO/KvoObject.h"

#include <cstdint>
#include <cstring>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/FailingMemory.h"
#include "support/SlotOf.h"

namespace {

class Plain : public KvoObject
{};

class Animal : public KvoObject
{
public:
    KVO_DECLARE_CLASS_INFO();
};
KVO_DEFINE_CLASS_INFO(Animal, &KvoObject::classInfo);

class Tool : public KvoObject
{
public:
    KVO_DECLARE_CLASS_INFO();
};
KVO_DEFINE_CLASS_INFO(Tool, &KvoObject::classInfo);

class Dog : public Animal
{
public:
    KVO_DECLARE_CLASS_INFO();
};
KVO_DEFINE_CLASS_INFO(Dog, &Animal::classInfo);

std::string Written(KvoObject& object)
{
    std::ostringstream out;
    object.Write(out);
    return out.str();
}

} // namespace

// --- class information -----------------------------------------------------

TEST(KvoClassInfo, KeepsACopyOfANameGivenAtRunTime)
{
    char name[] = "Widget";
    KvoClassInfo* no_base[] = {nullptr};

    KvoClassInfo record(name, no_base);
    name[0] = 'x';

    EXPECT_STREQ(record.name, "Widget");
    delete[] record.name; // a record is never freed; the test leaves nothing
}

TEST(KvoClassInfo, KeepsTheListOfBasesItWasGiven)
{
    static KvoClassInfo* bases[] = {&KvoObject::classInfo, nullptr};

    static KvoClassInfo record("Widget", bases);

    EXPECT_EQ(record.bases, bases);
}

TEST(KvoClassInfo, MatchesItself)
{
    EXPECT_EQ(Animal::classInfo.Match(&Animal::classInfo), 1);
}

TEST(KvoClassInfo, TwoRecordsOfTheSameNameMatchEachOther)
{
    static KvoClassInfo one("Widget", nullptr);
    static KvoClassInfo other("Widget", nullptr);

    EXPECT_EQ(one.Match(&other), 1);
    EXPECT_EQ(other.Match(&one), 1);
}

TEST(KvoClassInfo, RecordsOfDifferentNamesDoNotMatch)
{
    EXPECT_EQ(Animal::classInfo.Match(&Tool::classInfo), 0);
}

TEST(KvoClassInfo, NamesMatchWithTheirCase)
{
    static KvoClassInfo one("Widget", nullptr);
    static KvoClassInfo other("widget", nullptr);

    EXPECT_EQ(one.Match(&other), 0);
}

TEST(KvoClassInfo, NullMatchesNothing)
{
    EXPECT_EQ(KvoObject::classInfo.Match(nullptr), 0);
    EXPECT_EQ(KvoObject::classInfo.HasBase(nullptr), 0);
    EXPECT_EQ(KvoNamedObject::classInfo.HasBase(nullptr), 0);
    EXPECT_EQ(KvoObject::classInfo.CanCast(nullptr), 0);
}

TEST(KvoClassInfo, HasItsDirectBasesAndTheirs)
{
    EXPECT_EQ(Dog::classInfo.HasBase(&Animal::classInfo), 1);
    EXPECT_EQ(Dog::classInfo.HasBase(&KvoObject::classInfo), 1);
    EXPECT_EQ(Dog::classInfo.HasBase(&Tool::classInfo), 0);
}

TEST(KvoClassInfo, HasEveryOneOfSeveralBases)
{
    static KvoClassInfo* bases[] = {&Tool::classInfo, &Dog::classInfo, nullptr};
    static KvoClassInfo robot("Robot", bases);

    EXPECT_EQ(robot.HasBase(&Tool::classInfo), 1);
    EXPECT_EQ(robot.HasBase(&Dog::classInfo), 1);
    EXPECT_EQ(robot.HasBase(&Animal::classInfo), 1);
}

TEST(KvoClassInfo, IsNotItsOwnBase)
{
    EXPECT_EQ(Dog::classInfo.HasBase(&Dog::classInfo), 0);
}

TEST(KvoClassInfo, IsItsOwnBaseIfItListsItself)
{
    static KvoClassInfo* bases[2] = {nullptr, nullptr};
    static KvoClassInfo record("Snake", bases);
    bases[0] = &record;

    EXPECT_EQ(record.HasBase(&record), 1);
    EXPECT_EQ(record.HasBase(&Tool::classInfo), 0);
}

TEST(KvoClassInfo, WithoutAListOfBasesHasNone)
{
    static KvoClassInfo record("Rootless", nullptr);

    EXPECT_EQ(record.HasBase(&KvoObject::classInfo), 0);
    EXPECT_EQ(record.HasBase(&record), 0);
}

TEST(KvoClassInfo, TheRootHasNoBaseAtAll)
{
    EXPECT_EQ(KvoObject::classInfo.HasBase(&KvoObject::classInfo), 0);
    EXPECT_EQ(KvoObject::classInfo.HasBase(&KvoNamedObject::classInfo), 0);
    EXPECT_EQ(KvoObject::classInfo.HasBase(&Dog::classInfo), 0);
    EXPECT_NE(KvoObject::classInfo.bases, nullptr);
    EXPECT_EQ(KvoObject::classInfo.bases[0], nullptr);
}

TEST(KvoClassInfo, ACircleOfBasesEndsTheWalk)
{
    static KvoClassInfo* bases_of_one[] = {nullptr, nullptr};
    static KvoClassInfo* bases_of_other[] = {nullptr, nullptr, nullptr};
    static KvoClassInfo one("One", bases_of_one);
    static KvoClassInfo other("Other", bases_of_other);
    bases_of_one[0] = &other;
    bases_of_other[0] = &one;
    bases_of_other[1] = &Tool::classInfo;

    EXPECT_EQ(one.HasBase(&Dog::classInfo), 0);
    EXPECT_EQ(one.HasBase(&KvoObject::classInfo), 1);
    EXPECT_EQ(one.HasBase(&one), 1);
}

TEST(KvoClassInfo, CastsDerivedToBaseAndNotTheOtherWay)
{
    EXPECT_EQ(KvoNamedObject::classInfo.CanCast(&KvoObject::classInfo), 0);
    EXPECT_EQ(KvoObject::classInfo.CanCast(&KvoNamedObject::classInfo), 1);
    EXPECT_EQ(Dog::classInfo.CanCast(&Dog::classInfo), 1);
    EXPECT_EQ(Tool::classInfo.CanCast(&Dog::classInfo), 0);
}

TEST(KvoClassInfo, CastOfNullIsNull)
{
    EXPECT_EQ(KvoObject::classInfo.Cast(nullptr), nullptr);
    EXPECT_EQ(KvoNamedObject::classInfo.Cast(nullptr), nullptr);
    EXPECT_EQ(Dog::classInfo.Cast(nullptr), nullptr);
}

TEST(KvoClassInfo, CastGivesTheObjectOfTheClassOrOfOneDerivedFromIt)
{
    Dog dog;

    EXPECT_EQ(Dog::classInfo.Cast(&dog), &dog);
    EXPECT_EQ(Animal::classInfo.Cast(&dog), &dog);
    EXPECT_EQ(KvoObject::classInfo.Cast(&dog), &dog);
}

TEST(KvoClassInfo, CastToAnotherClassIsNull)
{
    Animal animal;
    Tool tool;

    EXPECT_EQ(Dog::classInfo.Cast(&animal), nullptr);
    EXPECT_EQ(Tool::classInfo.Cast(&animal), nullptr);
    EXPECT_EQ(KvoNamedObject::classInfo.Cast(&animal), nullptr);
    EXPECT_EQ(Animal::classInfo.Cast(&tool), nullptr);
}

TEST(KvoClassInfo, CastKnowsAClassByItsNameAlone)
{
    static KvoClassInfo seen_by_a_plug_in("Animal", nullptr);
    Dog dog;

    EXPECT_EQ(seen_by_a_plug_in.Cast(&dog), &dog);
}

TEST(KvoClassInfo, WithoutMemoryForItsNameMatchesOnlyItself)
{
    char name[] = "Widget"; // not a constant: the record wants a copy
    FailingMemory none;

    KvoClassInfo record(name, nullptr);

    EXPECT_EQ(record.name, nullptr);
    EXPECT_EQ(record.Match(&record), 1);
    EXPECT_EQ(record.Match(&KvoObject::classInfo), 0);
    EXPECT_EQ(KvoObject::classInfo.Match(&record), 0);
}

// --- the base object -------------------------------------------------------

TEST(KvoObject, IsUnmodifiedAtFirst)
{
    KvoObject object;

    EXPECT_EQ(object.modified, 0);
    EXPECT_EQ(object.IsModified(), 0);
}

TEST(KvoObject, IsModifiedBetweenSetAndClear)
{
    KvoObject object;

    object.SetModified();
    const int set = object.IsModified();
    object.ClearModified();

    EXPECT_EQ(set, 1);
    EXPECT_EQ(object.IsModified(), 0);
}

TEST(KvoObject, ACopyIsUnmodified)
{
    KvoObject object;
    object.SetModified();

    KvoObject copy(object);

    EXPECT_EQ(copy.IsModified(), 0);
}

TEST(KvoObject, AssignmentLeavesTheFlagAlone)
{
    KvoObject modified, unmodified;
    modified.SetModified();

    KvoObject& result = unmodified = modified;
    const int after_first = unmodified.IsModified();
    modified = unmodified;

    EXPECT_EQ(&result, &unmodified);
    EXPECT_EQ(after_first, 0);
    EXPECT_EQ(modified.IsModified(), 1);
}

TEST(KvoObject, CloneOfAnyObjectIsAPlainObject)
{
    Dog dog;
    dog.SetModified();

    std::unique_ptr<KvoObject> clone(dog.Clone());

    EXPECT_NE(clone.get(), &dog);
    EXPECT_STREQ(clone->ClassName(), "KvoObject");
    EXPECT_EQ(clone->ClassInfo(), &KvoObject::classInfo);
    EXPECT_EQ(clone->IsModified(), 0);
}

TEST(KvoObject, CloneWithoutMemoryIsNull)
{
    KvoObject object;
    FailingMemory none;

    EXPECT_EQ(object.Clone(), nullptr);
}

TEST(KvoObject, ComparesByAddress)
{
    KvoObject objects[2];

    EXPECT_LT(objects[0].Compare(&objects[1]), 0);
    EXPECT_GT(objects[1].Compare(&objects[0]), 0);
    EXPECT_EQ(objects[0].Compare(&objects[0]), 0);
}

TEST(KvoObject, ComparesAddressesThatLieFarApart)
{
    KvoObject object;
    const auto own = reinterpret_cast<std::uintptr_t>(&object);

    for (int bit = 20; bit < 40; ++bit) {
        const std::uintptr_t distance = std::uintptr_t(1) << bit;
        EXPECT_EQ(object.Compare(reinterpret_cast<void*>(own + distance)), -1);
        EXPECT_EQ(object.Compare(reinterpret_cast<void*>(own - distance)), 1);
    }
    EXPECT_EQ(object.Compare(nullptr), 1);
}

TEST(KvoObject, IsItsOwnKey)
{
    KvoObject object;

    EXPECT_EQ(object.Key(), &object);
    EXPECT_EQ(object.Compare(object.Key()), 0);
}

TEST(KvoObject, ReadsAndWritesNothing)
{
    KvoObject object;
    std::istringstream in("text");

    object.Read(in);

    EXPECT_EQ(in.tellg(), 0);
    EXPECT_EQ(Written(object), "");
}

TEST(KvoObject, IsNamedAfterTheMostDerivedClassThatDeclaresItself)
{
    Plain plain;
    Dog dog;
    KvoObject& as_base = dog;

    EXPECT_STREQ(KvoObject().ClassName(), "KvoObject");
    EXPECT_STREQ(plain.ClassName(), "KvoObject");
    EXPECT_STREQ(as_base.ClassName(), "Dog");
    EXPECT_EQ(as_base.ClassInfo(), &Dog::classInfo);
}

TEST(KvoObject, OperationsStandInTheOrderThatPlugInsCall)
{
    // The destructor takes the first two places.
    EXPECT_EQ(SlotOf(&KvoObject::Clone), 2);
    EXPECT_EQ(SlotOf(&KvoObject::Compare), 3);
    EXPECT_EQ(SlotOf(&KvoObject::Key), 4);
    EXPECT_EQ(SlotOf(&KvoObject::Read), 5);
    EXPECT_EQ(SlotOf(&KvoObject::Write), 6);
    EXPECT_EQ(SlotOf(&KvoObject::IsModified), 7);
    EXPECT_EQ(SlotOf(&KvoObject::SetModified), 8);
    EXPECT_EQ(SlotOf(&KvoObject::ClearModified), 9);
    EXPECT_EQ(SlotOf(&KvoObject::ClassInfo), 10);
}

// --- objects with a name ---------------------------------------------------

TEST(KvoNamedObject, IsCalledNoNameAtFirst)
{
    KvoNamedObject object;

    EXPECT_STREQ(object.name, "NoName");
    EXPECT_EQ(Written(object), "NoName");
}

TEST(KvoNamedObject, KeepsACopyOfItsName)
{
    char name[] = "edge";

    KvoNamedObject object(name);
    name[0] = 'x';

    EXPECT_STREQ(object.name, "edge");
}

TEST(KvoNamedObject, OfANullNameHasTheEmptyName)
{
    KvoNamedObject object(nullptr);

    ASSERT_NE(object.Key(), nullptr);
    EXPECT_STREQ(static_cast<char*>(object.Key()), "");
    EXPECT_EQ(Written(object), "");
}

TEST(KvoNamedObject, ACopyHasTheNameAndIsUnmodified)
{
    KvoNamedObject object("edge");
    object.SetModified();

    KvoNamedObject copy(object);

    EXPECT_STREQ(copy.name, "edge");
    EXPECT_NE(copy.name, object.name);
    EXPECT_EQ(copy.IsModified(), 0);
}

TEST(KvoNamedObject, AssignmentCopiesTheNameOnly)
{
    KvoNamedObject from("edge"), to("spot");
    from.SetModified();

    KvoNamedObject& result = to = from;

    EXPECT_EQ(&result, &to);
    EXPECT_STREQ(to.name, "edge");
    EXPECT_NE(to.name, from.name);
    EXPECT_EQ(to.IsModified(), 0);
}

TEST(KvoNamedObject, CanBeAssignedToItself)
{
    KvoNamedObject object("edge");
    KvoNamedObject& same = object;

    object = same;

    EXPECT_STREQ(object.name, "edge");
}

TEST(KvoNamedObject, TakesANewNameEvenOutOfItsOwn)
{
    KvoNamedObject object("edge");

    object.SetName("recognizer");
    object.SetName(object.name + 2);
    EXPECT_STREQ(object.name, "cognizer");

    object.SetName(object.name);
    EXPECT_STREQ(object.name, "cognizer");

    object.SetName(nullptr);
    EXPECT_STREQ(object.name, "");
}

TEST(KvoNamedObject, CloneIsAPlainNamedObjectOfTheSameName)
{
    class Directive : public KvoNamedObject
    {
    public:
        Directive() : KvoNamedObject("cd") {}
    };
    Directive object;
    object.SetModified();

    std::unique_ptr<KvoObject> clone(object.Clone());

    EXPECT_EQ(dynamic_cast<Directive*>(clone.get()), nullptr);
    EXPECT_STREQ(clone->ClassName(), "KvoNamedObject");
    EXPECT_EQ(Written(*clone), "cd");
    EXPECT_EQ(clone->IsModified(), 0);
}

TEST(KvoNamedObject, ComparesItsNameByteByByte)
{
    KvoNamedObject object("edge");
    char less[] = "Edge", equal[] = "edge", greater[] = "edge2";

    EXPECT_GT(object.Compare(less), 0);
    EXPECT_EQ(object.Compare(equal), 0);
    EXPECT_LT(object.Compare(greater), 0);
}

TEST(KvoNamedObject, ComparesBytesAsUnsigned)
{
    KvoNamedObject object("a");
    char accented[] = "\xe9";

    EXPECT_LT(object.Compare(accented), 0);
}

TEST(KvoNamedObject, ANullKeyIsTheEmptyText)
{
    KvoNamedObject named("edge"), nameless("");

    EXPECT_GT(named.Compare(nullptr), 0);
    EXPECT_EQ(nameless.Compare(nullptr), 0);
}

TEST(KvoNamedObject, IsKeyedByItsName)
{
    KvoNamedObject object("edge");

    EXPECT_EQ(object.Key(), object.name);
}

TEST(KvoNamedObject, ReadsNothing)
{
    KvoNamedObject object("edge");
    std::istringstream in("other");

    object.Read(in);

    EXPECT_STREQ(object.name, "edge");
    EXPECT_EQ(in.tellg(), 0);
}

TEST(KvoNamedObject, WritesTheNameAsItStands)
{
    KvoNamedObject object("two words; \"%n\"");

    EXPECT_EQ(Written(object), "two words; \"%n\"");
}

TEST(KvoNamedObject, WritesTheSameWhateverTheStreamIsSetTo)
{
    KvoNamedObject object("edge");
    std::ostringstream wide;
    wide.width(6);
    std::ostream broken(nullptr);
    EXPECT_THROW(broken.exceptions(std::ios::badbit), std::ios::failure);

    object.Write(wide);

    EXPECT_EQ(wide.str(), "edge");
    EXPECT_NO_THROW(object.Write(broken));
    EXPECT_TRUE(broken.bad());
}

TEST(KvoNamedObject, KeepsTheModifiedFlagOfTheBase)
{
    KvoNamedObject object("edge");

    object.SetName("spot");
    EXPECT_EQ(object.IsModified(), 0);

    object.SetModified();
    EXPECT_EQ(object.IsModified(), 1);

    object.ClearModified();
    EXPECT_EQ(object.IsModified(), 0);
}

TEST(KvoNamedObject, KnowsItsClass)
{
    KvoNamedObject object("edge");

    EXPECT_EQ(object.ClassInfo(), &KvoNamedObject::classInfo);
    EXPECT_STREQ(object.ClassName(), "KvoNamedObject");
    EXPECT_EQ(KvoNamedObject::classInfo.bases[0], &KvoObject::classInfo);
    EXPECT_EQ(KvoNamedObject::classInfo.bases[1], nullptr);
}

TEST(KvoNamedObject, WithoutMemoryHasTheEmptyName)
{
    KvoNamedObject later("edge");
    {
        FailingMemory none;
        KvoNamedObject object("edge");
        later.SetName("spot");

        EXPECT_STREQ(object.name, "");
        EXPECT_STREQ(later.name, "");
        EXPECT_EQ(object.Clone(), nullptr);
    }

    later.SetName("edge");

    EXPECT_STREQ(later.name, "edge");
}
