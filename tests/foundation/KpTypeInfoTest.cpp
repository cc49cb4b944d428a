#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpEditable.h>
#include <kplib/foundation/KpInterface.h>
#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>
#include <kplib/foundation/KpTypeInfo.h>

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

TEST(KpTypeInfo, registryFindsTheNewestOfANameThatIsAlive)
{
    std::vector<std::unique_ptr<KpTypeInfo>> types;
    for (const char* name : {"c", "a", "b", "b", "aa", "Z", "b"})
        types.push_back(std::make_unique<KpTypeInfo>(name, nullptr, types.empty() ? nullptr : types[0].get(), nullptr));
    EXPECT_TRUE(types[6]->isOfType(types[0].get())) << "identity, not name";
    EXPECT_TRUE(!types[6]->isOfType(types[2].get())) << "identity, not name";
    EXPECT_EQ(KpTypeInfo::fromName("a"), types[1].get());
    EXPECT_EQ(KpTypeInfo::fromName("b"), types[6].get());
    KpTypeInfo::removeType("b");
    types[2].reset();
    EXPECT_EQ(KpTypeInfo::fromName("b"), types[3].get()) << "what is left is found by identity, not by name";
    types.clear();
    for (const char* unknown : {"", "ab", "b", "zzz"})
        EXPECT_EQ(KpTypeInfo::fromName(unknown), nullptr) << unknown;
}

TEST(KpInterfaceOwner, attachesOnceFindsTheNewestAndEndsWhatItOwns)
{
    static std::string ends;
    static char next = 'a';
    static int calls = 0;
    struct Part : KpInterface {
        explicit Part(KpInterfaceOwner* itsOwner) : KpInterface(itsOwner, KpInterfaceOwner::OwnerDeletes) {}
        ~Part() override { ends += name, owner()->notifyDelete(); }  // a way back into the owner that has to be safe
        const char name = next++;
    };
    KpHandle<KpInterfaceOwner> owner(new KpInterfaceOwnerDefaultImpl);
    const auto attach = [](void* data) { ++calls, static_cast<KpInterfaceOwner*>(data)->getInterface(nullptr); };
    owner->registerAttachInterfacesOnceCB(attach, owner.get());
    KpTypedObject plain;
    owner->registerInterfaceStaticMemory(&plain);
    const KpInterface listed(owner.get(), KpInterfaceOwner::StaticMemory);
    KpInterface *const first = new Part(owner.get()), *const second = new Part(owner.get());
    EXPECT_EQ(owner->getInterface(KpInterface::getClassTypeId()), second);
    KpDArray<KpTypedObject*> all{&plain};
    owner->getAllInterfaces(all);
    EXPECT_EQ(std::vector(all.begin(), all.end()),
              (std::vector<KpTypedObject*>{second, first, const_cast<KpInterface*>(&listed), &plain, owner.get()}));
    owner = nullptr;
    EXPECT_EQ(ends + std::to_string(calls), "ba1");
}

TEST(KpEditable, announcesItsChanges)
{
    static std::string heard;
    struct Listener final : KpEditingListener {
        void editingStarted(KpEditable* object) override { heard += std::to_string(object->getEditingFlags()) + name; }
        void editingFinished(KpEditable*) override { heard += name; }
        char name;
        explicit Listener(char letter) : name(letter) {}
    } a('a'), b('b');
    KpEditable object;
    for (KpEditingListener* listener : {&a, &b, &a})
        object.addEditingListener(listener);
    object.startEditing(4);
    object.removeEditingListener(&a);
    object.startEditing(3);
    EXPECT_EQ(std::tuple(object.isEdited(6), object.isEdited(4)), std::tuple(true, false));
    EXPECT_EQ(std::tuple(object.isAllEdited(2), object.isAllEdited(6)), std::tuple(true, false));
    object.finishEditing();
    EXPECT_EQ(heard + std::to_string(object.getEditingFlags()), "4a4b4a3b3aba0");
}
