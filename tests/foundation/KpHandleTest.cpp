#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandableThreaded.h>
#include <kplib/foundation/KpHandle.h>

#include <gtest/gtest.h>

#include <atomic>
#include <future>
#include <utility>

namespace {

// An object that may hold the next one of its kind, and takes a handle to itself in its end.
template <typename Base>
struct Node : Base {
    explicit Node(int* counter) : deaths(counter) {}
    ~Node() override { ++*deaths; }
    void notifyDelete() override
    {
        KpHandle<Node> again(this);
        again = nullptr;
        EXPECT_EQ(*deaths, 0);
    }
    int* deaths;
    KpHandle<Node> next;
};

template <typename Base>
void checkCounts()
{
    int deaths = 0, later = 0;
    KpHandle<Node<Base>> a(new Node<Base>(&deaths)), b = a, c;
    c = a.get();
    a = *&a;
    b = std::move(*&b);
    EXPECT_EQ(a->refCount(), 3);
    a = std::move(b);
    c = nullptr;
    EXPECT_FALSE(b);
    EXPECT_EQ(std::tuple(a->refCount(), deaths), std::tuple(1, 0));
    a->next = new Node<Base>(&later);
    a = a->next;  // only the old head holds it
    EXPECT_EQ(std::tuple(a->refCount(), deaths, later), std::tuple(1, 1, 0));
    a = b;
    EXPECT_EQ(later, 1);

    const KpHandle<Base> first(new Base), second = first;
    const Base copy(*first);
    *first = copy;
    EXPECT_EQ(std::tuple(copy.refCount(), first->refCount()), std::tuple(0, 2)) << "the count is no part of the value";
}

}  // namespace

TEST(KpHandle, lastOneDeletesOnce)
{
    static_assert(sizeof(KpHandable) == 16 && sizeof(KpHandableThreaded) == 16 && sizeof(KpHandle<int>) == 8);
    checkCounts<KpHandable>();
    checkCounts<KpHandableThreaded>();
}

TEST(KpHandableThreads, lastOfManyThreadsDeletesOnceAndSeesTheirWork)
{
    static std::atomic<int> deaths = 0;
    struct Shared : KpHandableThreaded {
        ~Shared() override { deaths += cells[0] + cells[1] + cells[2] == 3; }
        int cells[3] = {};  // one a thread, not atomic: the last handle has to order them before the destructor
    };
    constexpr int rounds = 2000;
    for (int round = 0; round < rounds; ++round) {
        KpHandle<Shared> handle(new Shared);
        std::future<void> threads[3];
        for (int i = 0; i < 3; ++i) {
            threads[i] = std::async(std::launch::async, [copy = handle, i]() mutable {
                for (int k = 0; k < 10; ++k)
                    KpHandle<Shared>(copy)->isVirgin();
                copy->cells[i] = 1;
                copy = nullptr;
            });
        }
        handle = nullptr;
    }
    EXPECT_EQ(deaths, rounds);
}
