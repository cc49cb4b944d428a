#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpEditable.h>
#include <kplib/foundation/KpInterface.h>
#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>
#include <kplib/foundation/KpTypeInfo.h>

#include <support/ExhaustedMemory.h>
#include <support/VirtualSlot.h>

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

using kplib::test::slotOf;

TEST(KpTypeInfo, registryFindsWhatIsAlive)
{
    EXPECT_EQ(KpTypeInfo::fromName("KpTypedObject"), KpTypedObject::getClassTypeId());
    EXPECT_EQ(KpTypeInfo::fromName("KpInterface"), KpInterface::getClassTypeId());
    EXPECT_EQ(KpTypeInfo::fromName("KpInterfaceOwner"), KpInterfaceOwner::getClassTypeId());
    const long before = KpTypeInfo::allTypes().size();
    {
        const KpTypeInfo key("b");
        const std::string names[] = {"c", "a", "b", "b", "aa", "Z", "b"};
        std::vector<std::unique_ptr<KpTypeInfo>> types;
        for (const std::string& name : names)
            types.push_back(std::make_unique<KpTypeInfo>(name.c_str(), nullptr, nullptr, nullptr));
        const KpDArray<KpTypeInfo*>& all = KpTypeInfo::allTypes();
        ASSERT_EQ(all.size(), before + 7);
        for (long i = 1; i < all.size(); ++i)
            EXPECT_LE(std::strcmp(all[i - 1]->name(), all[i]->name()), 0);
        EXPECT_EQ(KpTypeInfo::fromName("a"), types[1].get());
        EXPECT_EQ(KpTypeInfo::fromName("b"), types[6].get()) << "the last of several";
        for (const char* unknown : {"", "ab", "A", "zzz"})
            EXPECT_EQ(KpTypeInfo::fromName(unknown), nullptr) << unknown;
        KpTypeInfo::removeType("b");
        EXPECT_EQ(KpTypeInfo::fromName("b"), types[3].get());
        types[2].reset();
        EXPECT_EQ(KpTypeInfo::fromName("b"), types[3].get()) << "the destroyed one, not one of its name";
        KpTypeInfo::removeType("unknown");
    }
    EXPECT_EQ(KpTypeInfo::allTypes().size(), before);
    EXPECT_EQ(KpTypeInfo::fromName("b"), nullptr);
}

TEST(KpTypeInfo, isOfTypeWalksBothParents)
{
    const KpTypeInfo root("root"), other("root"), left("left", nullptr, &root, nullptr);
    const KpTypeInfo both("both", nullptr, nullptr, &left);
    EXPECT_TRUE(both.isOfType(&both) && both.isOfType(&left) && both.isOfType(&root));
    EXPECT_FALSE(both.isOfType(&other)) << "identity, not name";
    EXPECT_FALSE(root.isOfType(&left) || root.isOfType(nullptr));
}

namespace {

struct Part : KpInterface {
    Part(KpInterfaceOwner* itsOwner, std::string* log, char letter) :
        KpInterface(itsOwner, KpInterfaceOwner::OwnerDeletes), ends(log), name(letter)
    {
    }
    ~Part() override
    {
        *ends += name;
        owner()->notifyDelete();  // a way back into the owner that has to be safe
    }
    std::string* ends;
    char name;
};

KpTypedObject* newestPart(const KpHandle<KpInterfaceOwner>& owner)
{
    return owner->getInterface(KpInterface::getClassTypeId());
}

}  // namespace

TEST(KpInterfaceOwner, findsTheNewestAndThenItself)
{
    const KpHandle<KpInterfaceOwner> owner(new KpInterfaceOwnerDefaultImpl);
    EXPECT_EQ(newestPart(owner), nullptr);
    KpTypedObject plain;
    owner->registerInterfaceStaticMemory(&plain);
    KpInterface first(owner.get(), KpInterfaceOwner::StaticMemory), second(owner.get(), KpInterfaceOwner::StaticMemory);
    EXPECT_EQ(newestPart(owner), &second);
    EXPECT_EQ(owner->getInterface(KpTypedObject::getClassTypeId()), &second);
    EXPECT_EQ(owner->getInterface(KpInterfaceOwner::getClassTypeId()), owner.get());
    EXPECT_EQ(owner->getInterface(nullptr), nullptr);
    KpDArray<KpTypedObject*> all{&plain};
    owner->getAllInterfaces(all);
    ASSERT_EQ(all.size(), 4);
    EXPECT_TRUE(all[0] == &second && all[1] == &first && all[2] == &plain && all[3] == owner.get());
}

TEST(KpInterfaceOwner, attachesOnceAtTheFirstQuery)
{
    static int calls;
    calls = 0;
    KpInterfaceOwnerDefaultImpl owner;
    owner.registerAttachInterfacesOnceCB(
        [](void* data) {
            ++calls;
            static_cast<KpInterfaceOwner*>(data)->getInterface(KpInterface::getClassTypeId());
        },
        static_cast<KpInterfaceOwner*>(&owner));
    KpDArray<KpTypedObject*> all;
    owner.getAllInterfaces(all);
    owner.getInterface(nullptr);
    EXPECT_EQ(calls, 1);
}

TEST(KpInterfaceOwner, takesWhatItOwnsWithItsLastHandle)
{
    struct Kept : KpHandable {
        explicit Kept(std::string* log) : ends(log) {}
        ~Kept() override { *ends += 'k'; }
        std::string* ends;
    };
    std::string ends;
    auto* const first = new Part(nullptr, &ends, 'a');
    KpHandle<KpInterfaceOwner> owner(first->owner());
    const KpInterface listed(owner.get(), KpInterfaceOwner::StaticMemory);
    new Part(owner.get(), &ends, 'b');
    owner->addHandle(new Kept(&ends));
    owner = nullptr;
    EXPECT_EQ(ends, "bak");
}

TEST(KpInterfaceOwner, registrationWithoutMemoryChangesNothing)
{
    KpInterfaceOwnerDefaultImpl owner;
    std::unique_ptr<KpInterface> attached;
    kplib::test::failAtEachAllocation(
        [&] { attached = std::make_unique<KpInterface>(&owner, KpInterfaceOwner::StaticMemory); },
        [&] { EXPECT_EQ(owner.getInterface(KpInterface::getClassTypeId()), attached.get()); });
    std::unique_ptr<KpInterface> alone;
    kplib::test::failAtEachAllocation(
        [&] { alone = std::make_unique<KpInterface>(nullptr, KpInterfaceOwner::StaticMemory); }, [] {});
    const KpHandle<KpInterfaceOwner> last(alone->owner());
}

TEST(KpEditable, announcesItsChanges)
{
    static std::string heard;
    struct Listener final : KpEditingListener {
        explicit Listener(char letter) : name(letter) {}
        void editingStarted(KpEditable* object) override { hear('+', object); }
        void editingFinished(KpEditable* object) override { hear('-', object); }
        void hear(char what, KpEditable* object) const
        {
            heard += {what, name, static_cast<char>('0' + object->getEditingFlags())};
        }
        char name;
    };
    heard.clear();
    Listener a('a'), b('b'), unknown('u');
    KpEditable object;
    for (KpEditingListener* listener : {&a, &b, &a})
        object.addEditingListener(listener);
    object.removeEditingListener(&unknown);
    object.startEditing(4);
    object.removeEditingListener(&a);
    object.startEditing(3);
    EXPECT_TRUE(object.isEdited(6) && object.isAllEdited(2) && object.isAllEdited(0));
    EXPECT_FALSE(object.isEdited(4) || object.isEdited(0) || object.isAllEdited(6));
    object.finishEditing();
    EXPECT_EQ(heard, "+a4+b4+a4+b3+a3-b3-a3");
    EXPECT_EQ(object.getEditingFlags(), 0);
}

TEST(KpTypedObject, tablesAreTheOnesOthersAreCompiledAgainst)
{
    EXPECT_EQ(slotOf(&KpTypedObject::getTypeId), 0);
    EXPECT_EQ(slotOf(&KpInterfaceOwner::ref), 3);
    EXPECT_EQ(slotOf(&KpInterfaceOwner::unref), 4);
    EXPECT_EQ(slotOf(&KpInterfaceOwner::notifyDelete), 5);
    EXPECT_EQ(slotOf(&KpEditable::startEditing), 0);
    EXPECT_EQ(slotOf(&KpEditable::getEditingFlags), 4);
    EXPECT_EQ(slotOf(&KpEditingListener::editingFinished), 1);
}
