#include "TreeJson.h"

#include "../dicom/DicomTree.h"
#include "../dicom/FrameValues.h"

#include <kplib/foundation/KpString.h>

#include <nlohmann/json.hpp>

namespace {

using Json = nlohmann::ordered_json;

Json treeOf(DcmItem& item);

bool isNumber(DcmEVR vr)
{
    switch (vr) {
    case EVR_DS:
    case EVR_IS:
    case EVR_FD:
    case EVR_FL:
    case EVR_US:
    case EVR_SS:
    case EVR_UL:
    case EVR_SL:
    case EVR_xs:
        return true;
    default:
        return false;
    }
}

Json valueOf(DcmElement& element)
{
    const KpString text = valueText(element);
    double number = 0;
    if (!isNumber(element.ident()) || *text.c_str() == '(' || !realOf(element, 0, number))
        return text.c_str();
    if (element.getVM() == 1)
        return number == static_cast<double>(static_cast<long>(number)) ? Json(static_cast<long>(number))
                                                                        : Json(number);
    Json values = Json::array();
    for (unsigned long i = 0; realOf(element, i, number); ++i)
        values.push_back(number);
    return values.size() == element.getVM() ? values : Json(text.c_str());
}

Json nodeOf(DcmItem& parent, DcmElement& element)
{
    DcmTag tag = element.getTag();
    Json node{{"vr", DcmVR(element.getVR()).getValidVRName()}};
    if (const std::string creator = creatorOf(parent, tag); !creator.empty())
        node["creator"] = creator;
    else
        node["keyword"] = tag.isPrivateReservation() ? "PrivateCreator" : tag.getTagName();
    if (element.ident() != EVR_SQ) {
        node["value"] = valueOf(element);
        return node;
    }
    auto& sequence = static_cast<DcmSequenceOfItems&>(element);
    node["items"] = Json::array();
    for (unsigned long i = 0; i < sequence.card(); ++i)
        node["items"].push_back(treeOf(*sequence.getItem(i)));
    return node;
}

Json treeOf(DcmItem& item)
{
    Json tree = Json::object();
    for (unsigned long i = 0; i < item.card(); ++i) {
        DcmElement& element = *item.getElement(i);
        const DcmTag& tag = element.getTag();
        tree[KpString(0, "G%04X-%04X", tag.getGTag(), tag.getETag()).c_str()] = nodeOf(item, element);
    }
    return tree;
}

}  // namespace

KpResult readHeaderAsJson(const char* path, std::string& json)
{
    DcmFileFormat file;
    if (KpResult loaded = loadDicom(path, file); loaded.isBad())
        return loaded;
    file.getDataset()->convertToUTF8();
    Json tree = treeOf(*file.getMetaInfo());
    tree.update(treeOf(*file.getDataset()));
    json = tree.dump(2, ' ', false, Json::error_handler_t::replace);
    return KpResult();
}
