#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandableThreaded.h>
#include <kplib/foundation/KpHandle.h>

#include <gtest/gtest.h>

#include <thread>
#include <utility>

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
static_assert(sizeof(KpHandable) == 16 && sizeof(KpHandableThreaded) == 16 && sizeof(KpHandle<int>) == 8);

}  // namespace

TYPED_TEST_SUITE(KpHandleTest, Bases, );

TYPED_TEST(KpHandleTest, lastHandleDeletesOnce)
{
    auto* const object = new Node<TypeParam>(&this->deaths);
    EXPECT_EQ(object->refCount(), 0);
    KpHandle<Node<TypeParam>> a(object), b = a, c;
    c = b;
    c = object;
    a = *&a;
    b = std::move(*&b);
    EXPECT_EQ(object->refCount(), 3);
    a = std::move(b);
    c = nullptr;
    a = a.get();
    EXPECT_TRUE(!b && a == object && a != b && &*a == object && a->refCount() == 1);
    EXPECT_EQ(this->deaths, 0);
    a = b;
    EXPECT_EQ(this->deaths, 1);
}

TYPED_TEST(KpHandleTest, newObjectIsHeldBeforeTheOldOneGoes)
{
    int later = 0;
    KpHandle<Node<TypeParam>> chain(new Node<TypeParam>(&this->deaths));
    chain->next = new Node<TypeParam>(&later);
    chain = chain->next;  // only the old head holds it
    EXPECT_TRUE(this->deaths == 1 && later == 0 && chain->refCount() == 1);
}

TYPED_TEST(KpHandleTest, countBelongsToTheObjectNotToItsValue)
{
    const KpHandle<Node<TypeParam>> handle(new Node<TypeParam>(&this->deaths)), second = handle;
    int ends = 0;
    Node<TypeParam> copy(*handle), other(&ends);
    EXPECT_EQ(copy.refCount(), 0);
    copy = other;
    *handle = other;
    handle->deaths = &this->deaths;
    EXPECT_EQ(handle->refCount(), 2);
}

TEST(KpHandableThreaded, tellsItsState)
{
    struct Asked : KpHandableThreaded {
        void notifyDelete() override { EXPECT_TRUE(refCount() == 0 && isDestructionInProgress() && !isVirgin()); }
    };
    auto* const object = new Asked;
    EXPECT_TRUE(object->isVirgin());
    object->ref();
    EXPECT_FALSE(object->isVirgin() || object->isDestructionInProgress());
    object->unrefNoDelete();
    EXPECT_TRUE(object->isVirgin() && object->refCount() == 0);
    const KpHandle<Asked> last(object);
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
        const auto work = [&](int i) {
            return std::thread([copy = handle, i]() mutable {
                for (int k = 0; k < 10; ++k)
                    KpHandle<Shared>(copy)->isVirgin();
                copy->cells[i] = 1;
                copy = nullptr;
            });
        };
        std::thread threads[] = {work(0), work(1), work(2)};
        handle = nullptr;
        for (std::thread& thread : threads)
            thread.join();
    }
    EXPECT_EQ(deaths, rounds);
}
