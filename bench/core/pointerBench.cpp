// RCShdPtr beside the counted pointers of Boost, the standard library and Qt: one copy, which goes
// again. The objects live as long as the process.
#include <QExplicitlySharedDataPointer>
#include <benchmark/benchmark.h>
#include <boost/smart_ptr/intrusive_ptr.hpp>
#include <boost/smart_ptr/intrusive_ref_counter.hpp>
#include <memory>
#include <orv/rcShdPtr.h>

namespace {

struct Plain {
    int value = 0;
};
struct OrvCounted : Orv::RCBase<Orv::LkCounter<long>> {};
struct OrvCountedByOneThread : Orv::RCBase<int> {};
struct BoostCounted : boost::intrusive_ref_counter<BoostCounted, boost::thread_safe_counter> {};
struct QtCounted : QSharedData {};

Orv::RCShdPtr<OrvCounted> orvPointer(new OrvCounted);
Orv::RCShdPtr<OrvCountedByOneThread> orvPointerOfOneThread(new OrvCountedByOneThread);
boost::intrusive_ptr<BoostCounted> boostPointer(new BoostCounted);
std::shared_ptr<Plain> stdPointer = std::make_shared<Plain>();
QExplicitlySharedDataPointer<QtCounted> qtPointer(new QtCounted);

template <auto* POINTER>
void copy(benchmark::State& state) {
    for (auto _ : state) {
        auto result = *POINTER;
        benchmark::DoNotOptimize(result);
    }
}

BENCHMARK(copy<&orvPointer>)->Name("copy/RCShdPtr");
BENCHMARK(copy<&orvPointerOfOneThread>)->Name("copy/RCShdPtr, RCBase<int>");
BENCHMARK(copy<&boostPointer>)->Name("copy/boost::intrusive_ptr");
BENCHMARK(copy<&stdPointer>)->Name("copy/std::shared_ptr");
BENCHMARK(copy<&qtPointer>)->Name("copy/QExplicitlySharedDataPointer");
BENCHMARK(copy<&orvPointer>)->Name("copy, 2 threads/RCShdPtr")->Threads(2)->UseRealTime();
BENCHMARK(copy<&boostPointer>)
    ->Name("copy, 2 threads/boost::intrusive_ptr")
    ->Threads(2)
    ->UseRealTime();
BENCHMARK(copy<&stdPointer>)->Name("copy, 2 threads/std::shared_ptr")->Threads(2)->UseRealTime();

}  // namespace
