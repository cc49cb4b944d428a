#include <support/Bench.h>

#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#ifdef KPLIB_BENCH_DCMTK
#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>
#endif

#include <algorithm>
#include <cstdio>
#include <random>
#include <string>
#include <unordered_map>
#include <vector>

namespace {

struct Tag {
    unsigned group, element;
    std::string name;
};

/// As many tags as asked for, spread over groups as a scanner spreads them, in random order.
std::vector<Tag> tags(int count)
{
    static const unsigned groups[] = {0x0008, 0x0010, 0x0018, 0x0018, 0x0020, 0x0028, 0x0040, 0x0054};
    std::vector<Tag> result;
    for (int i = 0; i < count; ++i) {
        const unsigned group = groups[i % 8], element = 0x0010 + static_cast<unsigned>(i / 8) * 0x11;
        char name[16];
        std::snprintf(name, sizeof(name), "G%04X-%04X", group, element + (i % 8 == 3 ? 0x1001 : 0));
        result.push_back({group, element + (i % 8 == 3 ? 0x1001 : 0), name});
    }
    std::shuffle(result.begin(), result.end(), std::mt19937(300));
    return result;
}

/// The header with these tags, six sequences with an item each, and the bundles beside DICOM that an image has.
HxParamBundle header(const std::vector<Tag>& content)
{
    HxParamBundle root("Image");
    root.bundle("Materials of heart", 1);
    for (const Tag& tag : content)
        root.setTag(tag.name.c_str(), "1.25");
    for (const char* sequence : {"G0008-1140", "G0008-1110", "G0040-0275", "G0040-0260", "G0018-9346", "G0054-0016"})
        root.dicomAllCreate()->bundle(sequence, 1)->bundle("Item_0", 1)->set("G0008-1150", ": 1.2.840");
    return root;
}

void mapFind(benchmark::State& state)
{
    const auto content = tags(static_cast<int>(state.range(0)));
    std::unordered_map<std::string, std::string> map;
    for (const Tag& tag : content)
        map[tag.name] = ": 1.25";
    for (auto _ : state) {
        for (const Tag& tag : content)
            benchmark::DoNotOptimize(map.find(tag.name));
    }
    kplib::bench::report(state, static_cast<double>(content.size()), 0);
}

void bundleFindTag(benchmark::State& state)
{
    const auto content = tags(static_cast<int>(state.range(0)));
    const HxParamBundle root = header(content);
    for (auto _ : state) {
        for (const Tag& tag : content)
            benchmark::DoNotOptimize(root.findTag(tag.name.c_str(), nullptr));
    }
    for (const Tag& tag : content) {
        if (std::string(root.findTag(tag.name.c_str(), "")) != "1.25")
            state.SkipWithError("wrong value");
    }
    kplib::bench::report(state, static_cast<double>(content.size()), 0,
                         "std::unordered_map/find/" + std::to_string(state.range(0)), 4.0);
}

#ifdef KPLIB_BENCH_DCMTK
void datasetFind(benchmark::State& state)
{
    const auto content = tags(static_cast<int>(state.range(0)));
    DcmDataset dataset;
    for (const Tag& tag : content)
        dataset.putAndInsertString(DcmTag(static_cast<Uint16>(tag.group), static_cast<Uint16>(tag.element), EVR_LO),
                                   "1.25");
    const char* value = nullptr;
    for (auto _ : state) {
        for (const Tag& tag : content)
            benchmark::DoNotOptimize(dataset.findAndGetString(
                DcmTagKey(static_cast<Uint16>(tag.group), static_cast<Uint16>(tag.element)), value));
    }
    if (!value || std::string(value) != "1.25")
        state.SkipWithError("wrong value");
    kplib::bench::report(state, static_cast<double>(content.size()), 0);
}

void bundleFindTagAgainstDataset(benchmark::State& state)
{
    bundleFindTag(state);
    kplib::bench::report(state, 0, 0, "DcmDataset/findAndGetString/" + std::to_string(state.range(0)), 0.1);
}

BENCHMARK(datasetFind)->Name("DcmDataset/findAndGetString")->Arg(300);
BENCHMARK(bundleFindTagAgainstDataset)->Name("findTag/dataset")->Arg(300);
#endif

BENCHMARK(mapFind)->Name("std::unordered_map/find")->Arg(300);
BENCHMARK(bundleFindTag)->Name("findTag")->Arg(300);

}  // namespace
