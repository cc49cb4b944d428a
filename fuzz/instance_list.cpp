// Lists of instances: any list that is stored comes back, and any bundle is read without harm.

#include "Fuzz.h"

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpString.h>
#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/param/HxParamBundle.h>

#include <vector>

namespace {

void goesRound(Input& input)
{
    KpDArray<KpString> list, read;
    while (input.size() > 0 && list.size() < 200)
        list.append(KpString(input.line().c_str()));
    HxParamBundle bundle("SOPInstanceUIDs");
    KpSOPInstanceUtility::setSopUIDList(&bundle, list);
    const bool isRead = KpSOPInstanceUtility::sopUIDList(&bundle, read);
    check(list.size() == 0 || isRead);
    check(!isRead || read.size() == list.size());
    for (long i = 0; isRead && i < list.size(); ++i)
        check(read[i] == list[i]);
    if (list.size() > 0)
        check(KpSOPInstanceUtility::checkSOPInstanceUID(&bundle, KpSOPInstanceUtility::sopUIDHash(list)));
}

void readsAnyBundle(Input& input)
{
    HxParamBundle object("Object");
    auto* bundle = new HxParamBundle("SOPInstanceUIDs");
    object.setTag("G0028-0008", input.line().c_str());
    int lines = 0;
    while (input.size() > 0 && lines++ < 50) {
        const std::string name = input.line(), text = input.line();
        if (!name.empty())
            bundle->set(name.c_str(), text.c_str());
    }
    object.insert(bundle, -1);
    KpDArray<std::string> list;
    KpSOPInstanceUtility::sopUIDList(bundle, list);
    KpSOPInstanceUtility::checkSOPInstanceUID(bundle, list);
    for (bool expand : {false, true}) {
        bool ok = false;
        KpSOPInstanceUtility::getReferencedSOPUIDsAndFrameNumbers(object, expand, &ok);
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    Input input(data, size);
    if (input.number<std::uint8_t>() % 2 != 0)
        goesRound(input);
    else
        readsAnyBundle(input);
    return 0;
}
