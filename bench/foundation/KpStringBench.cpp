#include <support/Bench.h>

#include <kplib/foundation/KpString.h>
#include <kplib/foundation/KpStringTokenizer.h>
#include <kplib/foundation/StringUtils.h>

#include <string>

namespace {

constexpr int many = 10'000'000;

template <typename Text>
void appendCharacters(benchmark::State& state)
{
    for (auto _ : state) {
        Text text;
        for (int i = 0; i < many; ++i)
            text += static_cast<char>('a' + i % 16);
        benchmark::DoNotOptimize(text.c_str());
    }
    const bool isBaseline = std::is_same_v<Text, std::string>;
    kplib::bench::report(state, many, many, isBaseline ? "" : "std::string/append/10M", isBaseline ? 0 : 1.2);
}

void tokenize(benchmark::State& state)
{
    KpString text;
    for (int i = 0; i < 1000; ++i)
        text += "word \"two words\" ";
    for (auto _ : state) {
        for (KpStringTokenizer tokenizer(text); tokenizer.hasMoreTokens();)
            benchmark::DoNotOptimize(tokenizer.nextToken().c_str());
    }
    kplib::bench::report(state, 2000, text.length());
}

}  // namespace

BENCHMARK(appendCharacters<std::string>)->Name("std::string/append/10M")->Unit(benchmark::kMillisecond);
BENCHMARK(appendCharacters<KpString>)->Name("KpString/append/10M")->Unit(benchmark::kMillisecond);
BENCHMARK(tokenize)->Name("KpStringTokenizer/2000 tokens");
