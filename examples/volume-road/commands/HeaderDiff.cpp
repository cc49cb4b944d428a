#include "../report/TreeJson.h"
#include "Commands.h"
#include "Load.h"

#include <nlohmann/json.hpp>

#include <initializer_list>
#include <map>
#include <string>
#include <vector>

namespace {

using Json = nlohmann::ordered_json;
using Leaves = std::map<std::string, Json>;  // by path

// The tag; of a private one without the number of its block, which differs between files, but with its creator.
std::string nameOf(const std::string& tag, const Json& node)
{
    if (!node.contains("creator"))
        return tag;
    return tag.substr(0, 6) + "xx" + tag.substr(8) + " [" + node["creator"].get<std::string>() + "]";
}

void addLeaves(const Json& tree, const std::string& prefix, Leaves& leaves)
{
    for (const auto& [tag, node] : tree.items()) {
        const std::string path = prefix + nameOf(tag, node);
        if (!node.contains("items")) {
            leaves[path] = node;
            continue;
        }
        const Json& items = node["items"];
        leaves[path] = {{"vr", node["vr"]}, {"keyword", node.value("keyword", "")}, {"items", items.size()}};
        for (std::size_t i = 0; i < items.size(); ++i)
            addLeaves(items[i], path + "/Item_" + std::to_string(i) + "/", leaves);
    }
}

KpResult readLeaves(const std::string& path, Leaves& leaves)
{
    std::string json;
    KpResult read = readHeaderAsJson(path.c_str(), json);
    if (read.isOk())
        addLeaves(Json::parse(json), "", leaves);
    return read;
}

std::string lineOf(const char* side, const std::string& path, const Json& leaf)
{
    const std::string keyword = leaf.value("keyword", "");
    const std::string value = leaf.contains("items") ? leaf["items"].dump() + " items" : leaf["value"].dump();
    return side + path + (keyword.empty() ? "" : " " + keyword) + ": " + value + " (" + leaf["vr"].get<std::string>() +
           ")\n";
}

// The paths of both, each once, that have not the same leaf.
Leaves differencesOf(const Leaves& a, const Leaves& b)
{
    Leaves differences;
    for (const auto& [path, leaf] : a)
        differences[path]["a"] = leaf;
    for (const auto& [path, leaf] : b)
        differences[path]["b"] = leaf;
    std::erase_if(differences, [](const auto& entry) {
        const Json& sides = entry.second;
        return sides.contains("a") && sides.contains("b") && sides["a"] == sides["b"];
    });
    return differences;
}

}  // namespace

KpResult diffHeaders(const Job& job)
{
    Leaves a, b;
    if (KpResult read = readLeaves(job.source, a); read.isBad())
        return read;
    if (KpResult read = readLeaves(job.other, b); read.isBad())
        return read;
    const Leaves differences = differencesOf(a, b);
    std::string text;
    for (const auto& [path, sides] : differences) {
        text += sides.contains("a") ? lineOf("- ", path, sides["a"]) : "";
        text += sides.contains("b") ? lineOf("+ ", path, sides["b"]) : "";
    }
    KpResult printed = printText(job.isJson ? Json(differences).dump(2) + "\n" : text);
    if (printed.isOk() && !differences.empty())
        return KpResult(KpResult::False, "the headers differ", nullptr);
    return printed;
}
