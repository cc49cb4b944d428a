#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandableThreaded.h>
#include <kplib/foundation/KpHandle.h>

#include <support/VirtualSlot.h>

#include <gtest/gtest.h>

#include <thread>
#include <utility>
#include <vector>

namespace {

// An object that may hold the next one of its kind, and takes a handle to itself in its end.
template <typename Base>
struct Node : Base {
    explicit Node(int* counter) : deaths(counter) {}
    Node(const Node&) = default;
    Node& operator=(const Node&) = default;
    ~Node() override { ++*deaths; }
    void notifyDelete() override
    {
        const KpHandle<Node> again(this);
        KpHandle<Node> copy = again;
        copy = nullptr;
        EXPECT_EQ(*deaths, 0);
    }
    int* deaths;
    KpHandle<Node> next;
};

template <typename Base>
class KpHandleTest : public testing::Test {
protected:
    int deaths = 0;
};
using Bases = testing::Types<KpHandable, KpHandableThreaded>;

}  // namespace

TYPED_TEST_SUITE(KpHandleTest, Bases, );

TYPED_TEST(KpHandleTest, lastHandleDeletesOnce)
{
    auto* const object = new Node<TypeParam>(&this->deaths);
    EXPECT_EQ(object->refCount(), 0);
    KpHandle<Node<TypeParam>> a(object), b = a, c;
    c = b;
    c = object;
    EXPECT_EQ(object->refCount(), 3);
    a = *&a;
    b = std::move(*&b);
    EXPECT_EQ(object->refCount(), 3);
    a = std::move(b);
    EXPECT_FALSE(b);
    c = nullptr;
    EXPECT_EQ(object->refCount(), 1);
    a = a.get();
    EXPECT_TRUE(a == object && a != b && a.get() == object && &*a == object && a->refCount() == 1);
    EXPECT_EQ(this->deaths, 0);
    a = KpHandle<Node<TypeParam>>();
    EXPECT_EQ(this->deaths, 1);
}

TYPED_TEST(KpHandleTest, newObjectIsHeldBeforeTheOldOneGoes)
{
    int later = 0;
    KpHandle<Node<TypeParam>> chain(new Node<TypeParam>(&this->deaths));
    chain->next = new Node<TypeParam>(&later);
    chain = chain->next;  // only the old head holds it
    EXPECT_EQ(this->deaths, 1);
    EXPECT_EQ(later, 0);
    EXPECT_EQ(chain->refCount(), 1);
}

TYPED_TEST(KpHandleTest, countBelongsToTheObjectNotToItsValue)
{
    KpHandle<Node<TypeParam>> handle(new Node<TypeParam>(&this->deaths));
    int copies = 0;
    {
        Node<TypeParam> copy(*handle);
        copy.deaths = &copies;
        EXPECT_EQ(copy.refCount(), 0);
        const KpHandle<Node<TypeParam>> second = handle;
        *handle = copy;
        EXPECT_EQ(handle->refCount(), 2);
        EXPECT_EQ(copies, 0);
    }
    handle->deaths = &this->deaths;
    EXPECT_EQ(handle->refCount(), 1);
}

TEST(KpHandableThreaded, tellsItsState)
{
    struct Asked : KpHandableThreaded {
        void notifyDelete() override
        {
            ref();
            EXPECT_EQ(refCount(), 0);
            EXPECT_TRUE(isDestructionInProgress());
            EXPECT_FALSE(isVirgin());
            unref();
        }
    };
    auto* const object = new Asked;
    EXPECT_TRUE(object->isVirgin());
    object->ref();
    EXPECT_FALSE(object->isVirgin() || object->isDestructionInProgress());
    object->unrefNoDelete();
    EXPECT_TRUE(object->isVirgin());
    EXPECT_EQ(object->refCount(), 0);
    object->ref();
    object->unref();
}

TEST(KpHandableThreads, lastOfManyThreadsDeletesOnceAndSeesTheirWork)
{
    struct Shared : KpHandableThreaded {
        explicit Shared(std::atomic<int>* counter) : deaths(counter) {}
        ~Shared() override { *deaths += cells[0] + cells[1] + cells[2] == 3; }
        std::atomic<int>* deaths;
        int cells[3] = {};  // one a thread, not atomic: the last handle has to order them before the destructor
    };
    constexpr int rounds = 2000;
    std::atomic<int> deaths = 0;
    for (int round = 0; round < rounds; ++round) {
        KpHandle<Shared> handle(new Shared(&deaths));
        std::vector<std::thread> threads;
        for (int i = 0; i < 3; ++i) {
            threads.emplace_back([copy = handle, i]() mutable {
                for (int k = 0; k < 10; ++k)
                    KpHandle<Shared>(copy)->isVirgin();
                copy->cells[i] = 1;
                copy = nullptr;
            });
        }
        handle = nullptr;
        for (std::thread& thread : threads)
            thread.join();
    }
    EXPECT_EQ(deaths, rounds);
}

TEST(KpHandable, tablesAndSizesAreTheOnesOthersAreCompiledAgainst)
{
    EXPECT_EQ(kplib::test::slotOf(&KpHandable::notifyDelete), 2);
    EXPECT_EQ(kplib::test::slotOf(&KpHandableThreaded::notifyDelete), 2);
    EXPECT_EQ(sizeof(KpHandable), 16u);
    EXPECT_EQ(sizeof(KpHandableThreaded), 16u);
    EXPECT_EQ(sizeof(KpHandle<KpHandable>), sizeof(void*));
}
