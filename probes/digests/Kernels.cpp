#include "Digest.h"

#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/geometry/detail/Mat4fKernels.h>
#include <kplib/geometry/numerics/detail/DelaunayKernels.h>
#include <kplib/geometry/numerics/detail/LinearSolver.h>
#include <kplib/rawdata/detail/DownSampleKernels.h>
#include <kplib/rawdata/detail/RawDataKernels.h>
#include <kplib/rawdata/detail/RowToolsKernels.h>
#include <kplib/rawdata/detail/TransposeKernels.h>
#include <kplib/system/detail/CoderKernels.h>
#include <kplib/volume/detail/BitfieldKernels.h>
#include <kplib/volume/detail/MorphologyKernels.h>

using namespace kplib::detail;

namespace kplib::test {
namespace {

constexpr long lengths[] = {1, 15, 33, 200, 5001};
constexpr KpPrimType numberTypes[] = {KpPrimType::Byte,  KpPrimType::Short,  KpPrimType::Int,
                                      KpPrimType::Float, KpPrimType::Double, KpPrimType::UShort};

/// work(tag of To, tag of From, to, from) for all pairs of number types.
template <typename Work>
void eachPair(Work work)
{
    for (const KpPrimType to : numberTypes)
        for (const KpPrimType from : numberTypes)
            kpVisitNumberType(to, [&](auto target) {
                kpVisitNumberType(from, [&](auto source) { work(target, source, to, from); });
            });
}

void rawDataTables()
{
    table("convert", convertPaths(), [](auto* loops, Digest& digest, Random& random) {
        eachPair([&]<typename To, typename From>(KpElementTag<To>, KpElementTag<From>, KpPrimType to, KpPrimType from) {
            for (const long n : lengths) {
                const auto src = noise<From>(random, n);
                std::vector<To> dst(src.size());
                loops(to, from)(dst.data(), src.data(), n);
                digest.take(dst);
            }
        });
    });
    table("map", mapPaths(), [](auto* loops, Digest& digest, Random& random) {
        eachPair([&]<typename To, typename From>(KpElementTag<To>, KpElementTag<From>, KpPrimType to, KpPrimType from) {
            for (const double scale : {0.1, -3.0}) {
                const auto src = noise<From>(random, 5001);
                std::vector<To> dst(src.size());
                loops(to, from)(dst.data(), src.data(), 5001, 1000 / 3.0, scale);
                digest.take(dst);
            }
        });
    });
    const auto ofRanges = [](auto take) {
        return [take](auto* loops, Digest& digest, Random& random) {
            for (const KpPrimType type : numberTypes)
                kpVisitNumberType(type, [&]<typename T>(KpElementTag<T>) {
                    for (const long n : lengths)
                        take(loops(type), digest, noise<T>(random, n));
                });
        };
    };
    table("range", rangePaths(), ofRanges([](auto* run, Digest& digest, auto values) {
              auto min = values[0], max = min;
              run(values.data(), static_cast<long>(values.size()), &min, &max);
              digest.take(min, max);
          }));
    table("differs", differsPaths(), ofRanges([](auto* run, Digest& digest, auto values) {
              std::fill(values.begin() + static_cast<long>(values.size()) * 2 / 3, values.end(), values[0]);
              digest.take(run(values.data(), static_cast<long>(values.size()), values.data()));
          }));
    table("swap", swapPaths(), [](auto* loops, Digest& digest, Random& random) {
        for (const int width : {2, 4, 8}) {
            auto words = noise<std::uint8_t>(random, 8 * 333);
            loops(width)(words.data(), 8 * 333 / width);
            digest.take(words);
        }
    });
    table("reverse", reversePaths(), [](auto* loops, Digest& digest, Random& random) {
        for (const int width : {1, 2, 3, 4, 8}) {
            const auto elements = noise<std::uint8_t>(random, 333 * width);
            std::vector<std::uint8_t> reversed(elements.size());
            loops(width)(reversed.data(), elements.data(), 333);
            digest.take(reversed);
        }
    });
    table("blocks", blockPaths(), [](auto* loops, Digest& digest, Random& random) {
        for (const KpPrimType type : numberTypes)
            kpVisitNumberType(type, [&]<typename T>(KpElementTag<T>) {
                for (const BlockRule rule : {BlockRule::Mean, BlockRule::Maximum})
                    for (const int f : {1, 2, 3, 4, 7})
                        for (const int components : {1, 2, 3, 4}) {
                            const long blocks = 61, width = blocks * f * components;
                            const auto src = noise<T>(random, width * f * 2);
                            std::vector<T> dst(blocks * components);
                            loops(type, rule)({src.data(), dst.data(), blocks, f, f, 2, components, width, width * f});
                            digest.take(dst);
                        }
            });
    });
    const auto scale = [](auto* run, Digest& digest, Random& random) {
        for (const long n : lengths) {
            const auto src = noise<float>(random, n);
            auto dst = noise<float>(random, n);
            run(src.data(), 0.3F, n, dst.data());
            digest.take(dst);
        }
    };
    table("multiplyAndStore", multiplyAndStorePaths(), scale);
    table("multiplyAndAdd", multiplyAndAddPaths(), scale);
    table("swapRows", swapRowsPaths(), [](auto* run, Digest& digest, Random& random) {
        auto a = noise<unsigned char>(random, 333), b = noise<unsigned char>(random, 333);
        run(reinterpret_cast<char*>(a.data()), reinterpret_cast<char*>(b.data()), 333);
        digest.take(a, b);
    });
    for (const long size : {1, 2, 4, 8})
        table(("transpose" + std::to_string(size)).c_str(), transposePaths(size),
              [=](auto* run, Digest& digest, Random& random) {
                  const auto from = noise<std::uint8_t>(random, 37 * 67 * size);
                  std::vector<std::uint8_t> to(from.size());
                  run(from.data(), to.data(), 37, 67);
                  digest.take(to);
              });
}

void geometryTables()
{
    table("transform", transformPaths(), [](auto* run, Digest& digest, Random& random) {
        for (const long n : lengths) {
            const auto matrix = noise<float>(random, 16);
            auto points = noise<float>(random, 3 * n);
            run(matrix.data(), points.data(), points.data(), n);
            digest.take(points);
        }
    });
    table("affineInverse", affineInversePaths(), [](auto* run, Digest& digest, Random& random) {
        for (int i = 0; i < 2000; ++i) {
            auto matrix = noise<float>(random, 16);
            for (const int row : {0, 1, 2, 3})
                matrix[4 * row + 3] = row == 3;
            digest.take(run(matrix.data(), matrix.data()), matrix);
        }
    });
    table("eliminate", eliminatePaths(), [](auto* run, Digest& digest, Random& random) {
        constexpr int n = 43;
        auto matrix = noise<float>(random, n * n);
        std::vector<float*> rows(n);
        for (int i = 0; i < n; ++i)
            rows[i] = matrix.data() + n * i;
        for (const int column : {0, 1, 17, n - 1})
            run(rows.data(), column, n);
        digest.take(matrix);
    });
    const auto scan = [](auto* run, Digest& digest, Random& random) {
        constexpr long n = 777;
        std::vector<double> columns[4];
        const double* starts[4];
        for (int axis = 0; axis < 4; ++axis) {
            columns[axis] = noise<double>(random, n);
            starts[axis] = columns[axis].data();
        }
        for (int i = 0; i < 50; ++i) {
            const auto point = noise<double>(random, 3);
            std::vector<std::int32_t> hits(n);
            const long count = run(starts, n, point.data(), hits.data());
            digest.take(std::span(hits).first(static_cast<std::size_t>(count)), count);
        }
    };
    table("circleScan2", delaunay::circleScanPaths<2>(), scan);
    table("circleScan3", delaunay::circleScanPaths<3>(), scan);
}

/// `n` words, most of them 0.
std::vector<BitWord> sparse(Random& random, long n)
{
    auto words = noise<BitWord>(random, n);
    for (long i = 0; i < n; ++i)
        words[i] = i % 1000 < 900 ? 0 : words[i];
    return words;
}

template <typename Op>
void anyTable(const char* name)
{
    table(name, anyPaths<Op>(), [](auto* run, Digest& digest, Random& random) {
        for (int i = 0; i < 50; ++i) {
            auto a = noise<BitWord>(random, 700 + 40 * i), b = a;
            for (std::size_t k = 0; k < a.size(); ++k)
                b[k] = std::is_same_v<Op, BitAnd> ? ~a[k] : a[k];
            b[random() % a.size()] ^= random() % 2 << random() % 32;
            digest.take(run(a.data(), b.data(), a.size()));
        }
    });
}

template <typename Op>
void combineTable(const char* name)
{
    table(name, combinePaths<Op>(), [](auto* run, Digest& digest, Random& random) {
        auto a = noise<BitWord>(random, 777);
        const auto b = noise<BitWord>(random, 777);
        run(a.data(), b.data(), a.size());
        digest.take(a);
    });
}

void volumeTables()
{
    table("countBits", countPaths(), [](auto* run, Digest& digest, Random& random) {
        for (const long n : lengths)
            digest.take(run(noise<BitWord>(random, n).data(), static_cast<unsigned long>(n)));
    });
    const auto find = [](auto* run, Digest& digest, Random& random) {
        for (int i = 0; i < 20; ++i) {
            const auto words = sparse(random, 800 + 60 * i);
            digest.take(run(words.data(), words.size(), 0), run(words.data(), words.size(), words[0]));
        }
    };
    table("findFirst", findFirstPaths(), find);
    table("findLast", findLastPaths(), find);
    combineTable<BitAnd>("combineAnd");
    combineTable<BitOr>("combineOr");
    combineTable<BitXor>("combineXor");
    anyTable<BitAnd>("anyAnd");
    anyTable<BitXor>("anyXor");
    anyTable<BitsMissing>("anyMissing");
    const auto fewLabels = [](Random& random, long n) {
        auto labels = noise<unsigned char>(random, n);
        for (unsigned char& label : labels)
            label %= 3;
        return labels;
    };
    table("fromLabels", fromLabelsPaths(), [=](auto* run, Digest& digest, Random& random) {
        for (const long n : lengths)
            for (const unsigned char label : {0, 1, 7}) {
                std::vector<BitWord> words(n / 32 + 1);
                run(words.data(), fewLabels(random, n).data(), static_cast<unsigned long>(n), label);
                digest.take(words);
            }
    });
    table("toLabels", toLabelsPaths(), [=](auto* loops, Digest& digest, Random& random) {
        for (const long n : lengths)
            for (const int policy : {KpBitfield::INSERT_SET, KpBitfield::INSERT_INTO_EMPTY, KpBitfield::INSERT_REPLACE,
                                     KpBitfield::INSERT_OWN}) {
                const auto words = noise<BitWord>(random, n / 32 + 1);
                auto labels = fewLabels(random, n);
                loops(static_cast<KpBitfield::InsertPolicy>(policy))(words.data(), labels.data(),
                                                                     static_cast<unsigned long>(n), 1);
                digest.take(labels);
            }
    });
    table("morphology", morphologyPaths(), [](auto* run, Digest& digest, Random& random) {
        for (const long width : {7, 64, 181})
            for (const int reach : {1, 2, 3})
                for (const bool erodes : {false, true}) {
                    auto words = noise<BitWord>(random, width * 21 * 9 / 32 + 1);
                    const MorphologyJob job{words.data(),           words.data(), width, 21, 9, 2,
                                            MorphologyReach{reach}, erodes};
                    std::vector<char> area(morphologyAreaBytes(job));
                    run(job, area.data());
                    words.back() &= (1U << width * 21 * 9 % 32) - 1;
                    digest.take(words);
                }
    });
}

}  // namespace

void digestsOfKernels()
{
    rawDataTables();
    geometryTables();
    volumeTables();
    table("crc", crcPaths(), [](auto* run, Digest& digest, Random& random) {
        for (const long n : lengths)
            digest.take(run(0x12345678, noise<unsigned char>(random, n).data(), n));
    });
    table("hex", hexPaths(), [](auto* run, Digest& digest, Random& random) {
        for (const char a : {'a', 'A'}) {
            std::string text(2 * 777, ' ');
            run(noise<unsigned char>(random, 777).data(), text.data(), 777, a);
            digest.take(text);
        }
    });
}

}  // namespace kplib::test
