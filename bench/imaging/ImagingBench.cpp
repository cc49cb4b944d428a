#include <kplib/foundation/KpDArray.h>
#include <kplib/imaging/KpCreateUIDs.h>
#include <kplib/imaging/KpSOPInstanceUtility.h>
#include <kplib/imaging/KpWindowLevel.h>
#include <kplib/imaging/TmgImages.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/system/KpCoder.h>

#include "support/Bench.h"

#include <string>

// New UIDs, instance lists of 50,000, the tags of 1000 images, presets.

namespace {

using kplib::bench::report;

constexpr int instances = 50000;

void createUID(benchmark::State& state)
{
    KpCreateUIDs creator;
    KpString uid;
    for (auto _ : state)
        benchmark::DoNotOptimize(creator.createUID(KpCreateUIDs::UIDtype0, uid));
    report(state, 1, 0);
}

KpDArray<std::string> uids()
{
    KpDArray<std::string> list;
    for (int i = 0; i < instances; ++i)
        list.append("1.2.276.0.77.7.2.84320313.26112123123000001." + std::to_string(i * 7919));
    return list;
}

void storeList(benchmark::State& state)
{
    const auto list = uids();
    for (auto _ : state) {
        HxParamBundle bundle("SOPInstanceUIDs");
        KpSOPInstanceUtility::setSopUIDList(&bundle, list);
        benchmark::DoNotOptimize(bundle.size());
    }
    report(state, instances, 0);
}

void readList(benchmark::State& state)
{
    HxParamBundle bundle("SOPInstanceUIDs");
    KpSOPInstanceUtility::setSopUIDList(&bundle, uids());
    for (auto _ : state) {
        KpDArray<std::string> list;
        benchmark::DoNotOptimize(KpSOPInstanceUtility::sopUIDList(&bundle, list));
    }
    report(state, instances, 0);
}

void digestOfTheBytes(benchmark::State& state)
{
    std::string bytes;
    for (const std::string& uid : uids())
        bytes += uid;
    for (auto _ : state) {
        KpCoder coder;
        coder.crcMD5Update(reinterpret_cast<const unsigned char*>(bytes.data()), static_cast<unsigned>(bytes.size()));
        coder.crcMD5Final();
        benchmark::DoNotOptimize(coder);
    }
    report(state, instances, static_cast<double>(bytes.size()));
}

void hashList(benchmark::State& state)
{
    const auto list = uids();
    for (auto _ : state)
        benchmark::DoNotOptimize(KpSOPInstanceUtility::sopUIDHash(list));
    report(state, instances, 0, "digestOfTheBytes", 1.5);
}

void imageLevelTags(benchmark::State& state)
{
    constexpr int images = 1000;
    HxParamBundle object("Object");
    KpDArray<KpString> texts;
    for (int i = 0; i < images; ++i)
        texts.append(KpString((std::to_string(i) + ",12.5,081500.25,1\\0\\0").c_str()));
    Tmg::setImageTagList(object.bundle("ImageNumberList", 1), texts);
    object.set("ImageLevelTags", "G0020-0013,G0020-1041,G0008-0032,G0018-9074");
    KpString value;
    bool approximate = false;
    for (auto _ : state) {
        for (int i = 0; i < images; ++i)
            benchmark::DoNotOptimize(Tmg::imageLevelTag(object, i, "G0008-0032", value, approximate));
    }
    report(state, images, 0);
}

void presetsThereAndBack(benchmark::State& state)
{
    const KpWindowLevelTagGroup group(
        std::array<std::string, 3>{"40\\-600\\400\\50", "400\\1600\\1800\\350", "SOFT\\LUNG\\BONE\\LIVER"});
    for (auto _ : state)
        benchmark::DoNotOptimize(KpWindowLevel::toTags(KpWindowLevel::createFromTags(group)));
    report(state, 4, 0);
}

BENCHMARK(createUID);
BENCHMARK(createUID)->Name("createUIDThreads")->Threads(8)->UseRealTime();
BENCHMARK(storeList);
BENCHMARK(readList);
BENCHMARK(digestOfTheBytes);
BENCHMARK(hashList);
BENCHMARK(imageLevelTags);
BENCHMARK(presetsThereAndBack);

}  // namespace
