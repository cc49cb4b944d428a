// Files of bit fields and of raw data that hold any bytes: what is missing is reported, the rest is read as it stands.

#include "Fuzz.h"

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/volume/KpBitfield.h>

#include <cstdio>
#include <unistd.h>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    getTheLogInstance().setLogLevel(KpLogOff);
    static const KpString path(0, "/dev/shm/kplib-fuzz-%d", static_cast<int>(getpid()));
    Input input(data, size);
    const unsigned long bits = input.number<std::uint16_t>();
    const int type = input.number<std::uint8_t>() % 10;
    const unsigned long n = input.number<std::uint8_t>();
    const std::string bytes = input.rest();
    std::FILE* file = std::fopen(path, "wb");
    check(file && std::fwrite(bytes.data(), 1, bytes.size(), file) == bytes.size());
    std::fclose(file);

    KpBitfield field;
    const bool isLoaded = field.load(path, bits);
    check(!isLoaded || (bits + 7) / 8 <= bytes.size());
    for (unsigned long i = 0; isLoaded && i < bits; ++i)
        check(field.test(i) == ((bytes[i / 8] >> (i % 8) & 1) != 0));

    const KpPrimType prim(static_cast<KpPrimType::Type>(type));
    std::vector<char> voxels(n * static_cast<unsigned long>(prim.size()));
    file = std::fopen(path, "rb");
    const auto read = KpRawData::readBigEndian({voxels.data(), prim}, n, file);
    check(static_cast<unsigned long>(read) ==
          std::min<unsigned long>(n, bytes.size() / static_cast<unsigned long>(prim.size())));
    std::fclose(file);
    return 0;
}
