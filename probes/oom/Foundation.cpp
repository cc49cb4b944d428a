#include "Operation.h"

#include <kplib/foundation/KpAllocator.h>
#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpException.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>
#include <kplib/foundation/KpMutex.h>
#include <kplib/foundation/KpStdStringTokenizer.h>
#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/foundation/KpStringTokenizerGeneral.h>
#include <kplib/foundation/KpThreadLocalStorage.h>

namespace kplib::probe {

namespace {

const char* const words = "one \"two words\" three;four,five  six;seven";

Outcome strings()
{
    KpString text("volume");
    for (int i = 0; i < 40; ++i)
        text += KpString(0, " %d", i).c_str();
    KpString other;
    other.printf("%s and %s", text.c_str(), text.substr(3, 20).c_str());
    other.replaceSubStr("1", "eleven");
    return Digest() << text << other << other.protect(true);
}

Outcome explode()
{
    KpDArray<KpString> pieces;
    KpString(words).explode(' ', pieces);
    Digest digest;
    for (const KpString& piece : pieces)
        digest << piece;
    return digest;
}

Outcome arrays()
{
    KpDArray<KpString> texts;
    for (int i = 0; i < 12; ++i)
        texts.insertSorted(KpString(0, "%d", i * 7 % 12), kpStandardCompare<KpString>);
    KpDArray<KpString> copy(texts);
    copy.remove(3);
    copy.resize(20);
    texts = copy;
    texts.remax();
    Digest digest;
    for (const KpString& text : texts)
        digest << text;
    return digest;
}

Outcome numbers()
{
    KpDArray<int> array{1, 2, 3};
    for (int i = 0; i < 100; ++i)
        array.append(i);
    array.insert(50, 3, array.data());
    return Digest().add(array.data(), static_cast<unsigned long>(array.size()) * sizeof(int));
}

Outcome tokens()
{
    Digest digest;
    for (KpStringTokenizer tokens(words); tokens.hasMoreTokens();)
        digest << tokens.nextToken();
    for (KpStringTokenizerGeneral tokens(words, ";,"); tokens.hasMoreTokens();)
        digest << tokens.nextToken();
    return digest;
}

Outcome standardTokens()
{
    Digest digest;
    std::string token;
    for (KpStdStringTokenizer tokens("a text that is longer than a small string holds", " "); tokens.hasMoreTokens();) {
        tokens.nextToken(token);
        digest << token;
    }
    return digest;
}

Outcome interfaces()
{
    struct Counted : KpHandable {};
    KpInterfaceOwnerDefaultImpl owner;
    KpTypedObject objects[3];
    for (KpTypedObject& object : objects)
        owner.registerInterfaceStaticMemory(&object);
    const KpHandle<Counted> counted(new Counted);
    owner.addHandle(counted.get());
    KpDArray<KpTypedObject*> found;
    owner.getAllInterfaces(found);
    return Digest() << found.size();
}

Outcome locks()
{
    KpMutex mutex(true);
    KpThreadLocalStorage<int> slot;
    int value = 3;
    slot.set(&value);
    mutex.lock();
    mutex.unlock();
    return Digest() << *slot.get();
}

Outcome exceptions()
{
    KpException first("%d bytes of %s", 5, "a text that takes memory of its own");
    const KpException second(first);
    return Digest() << first.what() << second.what();
}

Outcome allocators()
{
    Digest digest;
    for (const auto type : {KpAllocator::AllocatorMalloc, KpAllocator::AllocatorNew}) {
        const KpAllocator allocator(type);
        void* const block = allocator.allocate(1000);
        if (!block)
            return {};
        allocator.deallocate(block);
        digest << static_cast<int>(type);
    }
    return digest;
}

}  // namespace

Operations foundationOperations()
{
    static constexpr Operation list[] = {
        {"strings", strings},
        {"pieces of a string", explode},
        {"arrays of strings", arrays},
        {"arrays of numbers", numbers},
        {"tokens", tokens},
        {"tokens of std::string", standardTokens},
        {"interfaces", interfaces},
        {"a mutex and a value of a thread", locks},
        {"exceptions", exceptions},
        {"allocators", allocators},
    };
    return list;
}

}  // namespace kplib::probe
