// Conversions and ranges of any floating-point bits: every path gives the same bits, and integers stay in range.

#include "Fuzz.h"

#include <kplib/cpu/KernelPath.h>
#include <kplib/foundation/KpPrimType.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    static constexpr KpPrimType::Type numbers[] = {KpPrimType::Byte,  KpPrimType::Short,  KpPrimType::Int,
                                                   KpPrimType::Float, KpPrimType::Double, KpPrimType::UShort};
    Input input(data, size);
    const KpPrimType to = numbers[input.number<std::uint8_t>() % 6], from = numbers[input.number<std::uint8_t>() % 6];
    const double offset = input.number<double>(), scale = input.number<double>();
    std::vector<std::uint8_t> source(input.data(), input.data() + input.size());
    const long n = static_cast<long>(source.size()) / from.size();
    std::vector<std::vector<char>> converted, mapped;
    const auto empty = [&] { return std::vector<char>(static_cast<std::size_t>(n * to.size())); };
    for (const auto& path : kplib::detail::convertPaths()) {
        if (path.usable && n > 0)
            path.run(to, from)(converted.emplace_back(empty()).data(), source.data(), n);
    }
    for (const auto& path : kplib::detail::mapPaths()) {
        if (path.usable && n > 0)
            path.run(to, from)(mapped.emplace_back(empty()).data(), source.data(), n, offset, scale);
    }
    for (const auto& result : converted)
        check(result == converted[0]);
    for (const auto& result : mapped)
        check(to == KpPrimType::Float || to == KpPrimType::Double ||
              result == mapped[0]);  // NaNs may differ in their payload
    if (n > 0) {
        float low = 0, high = 0;
        KpRawData::getRange({source.data(), from}, static_cast<unsigned long>(n), low, high);
        check(!(low > high));
    }
    return 0;
}
