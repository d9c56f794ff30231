// LiString beside the strings of the standard library, Qt and Abseil.
#include <QByteArray>
#include <QHash>
#include <absl/hash/hash.h>
#include <absl/strings/str_cat.h>
#include <benchmark/benchmark.h>
#include <orv/liString.h>
#include <string>

namespace {

using Orv::LiString;

constexpr char TEXT_24[] = "device.property.valueXYZ";
constexpr char HAYSTACK_64[] = "the quick brown fox jumps over a lazy dog while needle is late..";
static_assert(sizeof TEXT_24 == 25 && sizeof HAYSTACK_64 == 65);

int find(const LiString& text, const LiString& part) {
    return text.find(part);
}
std::size_t find(const std::string& text, const std::string& part) {
    return text.find(part);
}
qsizetype find(const QByteArray& text, const QByteArray& part) {
    return text.indexOf(part);
}

std::size_t hash(const LiString& text) {
    return text.hash();
}
std::size_t hash(const std::string& text) {
    return std::hash<std::string>()(text);
}
std::size_t hash(const QByteArray& text) {
    return qHash(text);
}

template <class String>
void copy(benchmark::State& state) {
    String source(TEXT_24);
    for (auto _ : state) {
        benchmark::DoNotOptimize(source);
        String result(source);
        benchmark::DoNotOptimize(result);
    }
}

template <class String>
void append(benchmark::State& state) {
    for (auto _ : state) {
        String result;
        for (int i = 0; i < 64; ++i) result += 'x';
        benchmark::DoNotOptimize(result);
    }
}

template <class String>
void concatenate(benchmark::State& state) {
    String first("deviceName");
    String second("property");
    String third("value6");
    for (auto _ : state) {
        String result = first + second + third;
        benchmark::DoNotOptimize(result);
    }
}

void concatenateWithAbsl(benchmark::State& state) {
    std::string first("deviceName");
    std::string second("property");
    std::string third("value6");
    for (auto _ : state) {
        std::string result = absl::StrCat(first, second, third);
        benchmark::DoNotOptimize(result);
    }
}

template <class String>
void compareEqual(benchmark::State& state) {
    String left(TEXT_24);
    String right(TEXT_24);
    for (auto _ : state) {
        benchmark::DoNotOptimize(left);
        benchmark::DoNotOptimize(right);
        benchmark::DoNotOptimize(left == right);
    }
}

template <class String>
void compareLess(benchmark::State& state) {
    String left(TEXT_24);
    String right("device.property.valueXYa");
    for (auto _ : state) {
        benchmark::DoNotOptimize(left);
        benchmark::DoNotOptimize(right);
        benchmark::DoNotOptimize(left < right);
    }
}

template <class String>
void hashText(benchmark::State& state) {
    String text(TEXT_24);
    for (auto _ : state) {
        benchmark::DoNotOptimize(text);
        benchmark::DoNotOptimize(hash(text));
    }
}

void hashWithAbsl(benchmark::State& state) {
    std::string text(TEXT_24);
    for (auto _ : state) {
        benchmark::DoNotOptimize(text);
        benchmark::DoNotOptimize(absl::Hash<std::string>()(text));
    }
}

template <class String>
void findPart(benchmark::State& state) {
    String text(HAYSTACK_64);
    String part("needle");
    for (auto _ : state) {
        benchmark::DoNotOptimize(text);
        benchmark::DoNotOptimize(find(text, part));
    }
}

BENCHMARK(copy<LiString>)->Name("copy 24/LiString");
BENCHMARK(copy<std::string>)->Name("copy 24/std::string");
BENCHMARK(copy<QByteArray>)->Name("copy 24/QByteArray");
BENCHMARK(append<LiString>)->Name("append 64 x 1/LiString");
BENCHMARK(append<std::string>)->Name("append 64 x 1/std::string");
BENCHMARK(append<QByteArray>)->Name("append 64 x 1/QByteArray");
BENCHMARK(concatenate<LiString>)->Name("concatenate 3/LiString");
BENCHMARK(concatenate<std::string>)->Name("concatenate 3/std::string");
BENCHMARK(concatenate<QByteArray>)->Name("concatenate 3/QByteArray");
BENCHMARK(concatenateWithAbsl)->Name("concatenate 3/absl::StrCat");
BENCHMARK(compareEqual<LiString>)->Name("equal 24/LiString");
BENCHMARK(compareEqual<std::string>)->Name("equal 24/std::string");
BENCHMARK(compareEqual<QByteArray>)->Name("equal 24/QByteArray");
BENCHMARK(compareLess<LiString>)->Name("less 24/LiString");
BENCHMARK(compareLess<std::string>)->Name("less 24/std::string");
BENCHMARK(compareLess<QByteArray>)->Name("less 24/QByteArray");
BENCHMARK(hashText<LiString>)->Name("hash 24/LiString");
BENCHMARK(hashText<std::string>)->Name("hash 24/std::string");
BENCHMARK(hashText<QByteArray>)->Name("hash 24/QByteArray");
BENCHMARK(hashWithAbsl)->Name("hash 24/absl::Hash");
BENCHMARK(findPart<LiString>)->Name("find 6 in 64/LiString");
BENCHMARK(findPart<std::string>)->Name("find 6 in 64/std::string");
BENCHMARK(findPart<QByteArray>)->Name("find 6 in 64/QByteArray");

}  // namespace
