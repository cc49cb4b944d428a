// Dates and times of headers, and the values that differ from image to image, from any text.

#include "Fuzz.h"

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpString.h>
#include <kplib/imaging/TmgDateTime.h>
#include <kplib/imaging/TmgImages.h>
#include <kplib/imaging/TmgText.h>
#include <kplib/param/HxParamBundle.h>

#include <stdexcept>

namespace {

void datesAndTimes(const std::string& text)
{
    const long date = Tmg::dateReformat(text);
    Tmg::dateReformat(date);
    Tmg::timeReformat(text.c_str());
    const std::string key = Tmg::timeString(text, false), inverted = Tmg::timeString(text, true);
    check(text.size() < 6 || key.empty() == inverted.empty());
    try {
        Tmg::splitAndReformatDateTime(text, ' ');
    } catch (const std::logic_error&) {
        return;  // no number, or one out of range
    }
}

void valuesOfImages(Input& input)
{
    HxParamBundle object("Volume");
    object.setTag("G0020-0013", input.line().c_str());
    object.setTag("G0028-0008", input.line().c_str());
    object.set("ImageLevelTags", input.line().c_str());
    KpDArray<KpString> texts;
    while (input.size() > 0 && texts.size() < 50)
        texts.append(KpString(input.line().c_str()));
    auto* list = new HxParamBundle("ImageNumberList");
    Tmg::setImageTagList(list, texts);
    object.insert(list, -1);
    for (int index : {-1, 0, 1, static_cast<int>(texts.size()) - 1, static_cast<int>(texts.size())}) {
        int number = 0;
        KpString value;
        bool approximate = false;
        const bool isListed = Tmg::imageNumberFromBundle(list, index, number);
        check(!isListed || (index >= 0 && index < texts.size()));
        Tmg::imageNumber(object, index, number);
        Tmg::frameNumber(object, index % 2 != 0, index, number);
        Tmg::imageLevelTag(object, index, "G0020-1041", value, approximate);
    }
    KpDArray<int> numbers;
    Tmg::imageNumbers3D(object, -3, 1000, numbers);
    check(numbers.size() <= texts.size());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    Input input(data, size);
    datesAndTimes(input.line());
    KpString values(input.line().c_str());
    const KpString once = (Tmg::addToMultiValueString(values, KpString("a\\b"), "\\"), values);
    const bool isQuoted = std::strchr(once, '"') != nullptr;  // an open quote includes the separators after it
    check(isQuoted || (!Tmg::addToMultiValueString(values, KpString("a\\b"), "\\") && values == once));
    valuesOfImages(input);
    return 0;
}
