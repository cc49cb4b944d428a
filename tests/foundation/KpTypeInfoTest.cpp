#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpEditable.h>
#include <kplib/foundation/KpInterface.h>
#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>
#include <kplib/foundation/KpTypeInfo.h>

#include <support/VirtualSlot.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

TEST(KpTypeInfo, registryFindsWhatIsAlive)
{
    for (const KpTypeInfo* type :
         {KpTypedObject::getClassTypeId(), KpInterface::getClassTypeId(), KpInterfaceOwner::getClassTypeId()})
        EXPECT_EQ(KpTypeInfo::fromName(type->name()), type);
    const KpDArray<KpTypeInfo*>& all = KpTypeInfo::allTypes();
    const long before = all.size();
    {
        const KpTypeInfo key("b");
        std::vector<std::unique_ptr<KpTypeInfo>> types;
        for (const char* name : {"c", "a", "b", "b", "aa", "Z", "b"})
            types.push_back(std::make_unique<KpTypeInfo>(name, nullptr, nullptr, nullptr));
        EXPECT_EQ(all.size(), before + 7);
        EXPECT_TRUE(std::is_sorted(all.begin(), all.end(),
                                   [](auto* a, auto* b) { return std::strcmp(a->name(), b->name()) < 0; }));
        EXPECT_EQ(KpTypeInfo::fromName("a"), types[1].get());
        EXPECT_EQ(KpTypeInfo::fromName("b"), types[6].get()) << "the last of several";
        KpTypeInfo::removeType("b");
        types[2].reset();
        EXPECT_EQ(KpTypeInfo::fromName("b"), types[3].get()) << "what is left is found by identity, not by name";
        KpTypeInfo::removeType("unknown");
    }
    EXPECT_EQ(all.size(), before);
    for (const char* unknown : {"", "ab", "A", "b", "zzz"})
        EXPECT_EQ(KpTypeInfo::fromName(unknown), nullptr) << unknown;
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

std::string ends;  // of the objects below, by their letters

struct Part : KpInterface {
    Part(KpInterfaceOwner* itsOwner, char letter) : KpInterface(itsOwner, KpInterfaceOwner::OwnerDeletes), name(letter)
    {
    }
    ~Part() override
    {
        ends += name;
        owner()->notifyDelete();  // a way back into the owner that has to be safe
    }
    char name;
};

struct Kept : KpHandable {
    ~Kept() override { ends += 'k'; }
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
    static int calls = 0;
    KpInterfaceOwnerDefaultImpl owner;
    const auto attach = [](void* data) {
        ++calls;
        static_cast<KpInterfaceOwner*>(data)->getInterface(nullptr);
    };
    owner.registerAttachInterfacesOnceCB(attach, static_cast<KpInterfaceOwner*>(&owner));
    KpDArray<KpTypedObject*> all;
    owner.getAllInterfaces(all);
    owner.getInterface(nullptr);
    EXPECT_EQ(calls, 1);
}

TEST(KpInterfaceOwner, takesWhatItOwnsWithItsLastHandle)
{
    KpHandle<KpInterfaceOwner> owner((new Part(nullptr, 'a'))->owner());
    const KpInterface listed(owner.get(), KpInterfaceOwner::StaticMemory);
    new Part(owner.get(), 'b');
    owner->addHandle(new Kept);
    owner = nullptr;
    EXPECT_EQ(ends, "bak");
}

TEST(KpEditable, announcesItsChanges)
{
    static std::string heard;
    struct Listener final : KpEditingListener {
        void editingStarted(KpEditable* object) override { heard += std::to_string(object->getEditingFlags()) + name; }
        void editingFinished(KpEditable* object) override
        {
            heard += std::to_string(-object->getEditingFlags()) + name;
        }
        char name;
        explicit Listener(char letter) : name(letter) {}
    } a('a'), b('b'), unknown('u');
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
    EXPECT_EQ(heard, "4a4b4a3b3a-3b-3a");
    EXPECT_EQ(object.getEditingFlags(), 0);
}

TEST(KpTypedObject, tablesAreTheOnesOthersAreCompiledAgainst)
{
    EXPECT_EQ(kplib::test::slotsOf(&KpTypedObject::getTypeId, &KpInterfaceOwner::ref, &KpInterfaceOwner::notifyDelete,
                                   &KpEditable::startEditing, &KpEditable::getEditingFlags,
                                   &KpEditingListener::editingFinished),
              (std::vector<long>{0, 3, 5, 0, 4, 1}));
}
