// What it costs to build and release containers that inherit from one base
// container, as the number of such containers grows: every one of them
// registers with each of the base's values, so the base's observer lists
// grow with it. The cost per container must not. Also the time one change
// of a base value takes to reach every shadow of it, and the heap that one
// shadow value takes, everything it brings with it included (its entry in
// its container, its registrations with its container and its base).
#include <benchmark/benchmark.h>
#include <malloc.h>

#include <cstdio>
#include <cstring>
#include <memory>
#include <vector>

#include "BenchContainer.h"
#include "LS_CData.h"
#include "RatioReporter.h"

namespace {

constexpr int kBaseValues = 100;

RefPtr<BenchContainer> makeBase() {
  RefPtr<BenchContainer> base = adoptRef(new BenchContainer);
  for (int i = 0; i < kBaseValues; ++i)
    LS_setDataElement<unsigned int>(base.get(), String().format("value-%d", i), 1u);
  return base;
}

std::vector<RefPtr<BenchContainer>> makeDerived(BenchContainer* base, int count) {
  std::vector<RefPtr<BenchContainer>> derived;
  derived.reserve(count);
  for (int i = 0; i < count; ++i) {
    derived.push_back(adoptRef(new BenchContainer));
    derived.back()->setBase(base);
  }
  return derived;
}

// Hands freed memory back to the system, so that every build, small or
// large, first-touches fresh pages as a gateway's start-up does; otherwise
// the small sizes would run on pages left warm by their previous iteration.
void returnFreedMemory() {
  malloc_trim(0);
}

// Touches, once, as much memory as the largest size builds, and gives it
// back. In a virtual machine whose host backs guest memory only on first
// use, that first touch costs several times what a page fault costs later;
// without this the largest size alone would pay it, for a reason that has
// nothing to do with the library.
void touchMemoryOnce(size_t bytes) {
  constexpr size_t kChunk = 64u << 20;
  std::vector<std::unique_ptr<char[]>> chunks;
  for (size_t touched = 0; touched < bytes; touched += kChunk) {
    chunks.emplace_back(new char[kChunk]);
    std::memset(chunks.back().get(), 1, kChunk);
  }
  chunks.clear();
  returnFreedMemory();
}

void BM_BuildDerivedContainers(benchmark::State& state) {
  int const count = static_cast<int>(state.range(0));
  RefPtr<BenchContainer> const base = makeBase();
  for (auto _ : state) {
    std::vector<RefPtr<BenchContainer>> derived = makeDerived(base.get(), count);
    state.PauseTiming();
    derived.clear();
    returnFreedMemory();
    state.ResumeTiming();
  }
  state.SetItemsProcessed(state.iterations() * count);
}

void BM_ReleaseDerivedContainers(benchmark::State& state) {
  int const count = static_cast<int>(state.range(0));
  RefPtr<BenchContainer> const base = makeBase();
  for (auto _ : state) {
    state.PauseTiming();
    std::vector<RefPtr<BenchContainer>> derived = makeDerived(base.get(), count);
    state.ResumeTiming();
    derived.clear();
    state.PauseTiming();
    returnFreedMemory();
    state.ResumeTiming();
  }
  state.SetItemsProcessed(state.iterations() * count);
}

// One write of a base value, announced to every derived container through
// its shadow of that value.
void BM_BaseChangeReachesEveryShadow(benchmark::State& state) {
  int const count = static_cast<int>(state.range(0));
  RefPtr<BenchContainer> const base = makeBase();
  std::vector<RefPtr<BenchContainer>> const derived = makeDerived(base.get(), count);
  String const key("value-0");
  unsigned int value = 1;
  for (auto _ : state)
    LS_setDataElement<unsigned int>(base.get(), key, ++value);
  state.SetItemsProcessed(state.iterations() * count);
}

// The single registration the above are made of, on a subject that already
// has count observers.
void BM_RegisterAndRemoveOneObserver(benchmark::State& state) {
  int const count = static_cast<int>(state.range(0));
  RefPtr<BenchContainer> const subject = adoptRef(new BenchContainer);
  std::vector<RefPtr<BenchContainer>> const watchers = makeDerived(subject.get(), count);
  RefPtr<BenchContainer> const newcomer = adoptRef(new BenchContainer);
  for (auto _ : state) {
    subject->addElementObserver(newcomer.get(), 0);
    subject->removeElementObserver(newcomer.get());
  }
}

// The heap per shadow value of kMeasuredContainers containers based on one
// container of kBaseValues values, the containers themselves included.
double bytesPerShadowValue() {
  constexpr int kMeasuredContainers = 10000;
  RefPtr<BenchContainer> const base = makeBase();
  size_t const before = mallinfo2().uordblks;
  std::vector<RefPtr<BenchContainer>> const derived = makeDerived(base.get(), kMeasuredContainers);
  return static_cast<double>(mallinfo2().uordblks - before) / (kMeasuredContainers * kBaseValues);
}

BENCHMARK(BM_BuildDerivedContainers)->Arg(1000)->Arg(10000)->Arg(100000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ReleaseDerivedContainers)->Arg(1000)->Arg(10000)->Arg(100000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_BaseChangeReachesEveryShadow)->Arg(1000)->Arg(10000)->Arg(100000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_RegisterAndRemoveOneObserver)->Arg(2000)->Arg(64000);

}  // namespace

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  touchMemoryOnce(size_t{6} << 30);  // 100,000 containers take about 5 GiB
  RatioReporter reporter({{"BM_BuildDerivedContainers/10000", "BM_BuildDerivedContainers/1000"},
                          {"BM_BuildDerivedContainers/100000", "BM_BuildDerivedContainers/1000"},
                          {"BM_ReleaseDerivedContainers/10000", "BM_ReleaseDerivedContainers/1000"},
                          {"BM_ReleaseDerivedContainers/100000", "BM_ReleaseDerivedContainers/1000"},
                          {"BM_BaseChangeReachesEveryShadow/100000", "BM_BaseChangeReachesEveryShadow/1000"},
                          {"BM_RegisterAndRemoveOneObserver/64000", "BM_RegisterAndRemoveOneObserver/2000"}});
  benchmark::RunSpecifiedBenchmarks(&reporter);
  std::printf("one shadow value: %.0f bytes\n", bytesPerShadowValue());
  benchmark::Shutdown();
  return 0;
}
