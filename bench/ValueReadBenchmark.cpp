// How much a value read costs when it is inherited through a chain of
// containers, against a read of the container's own value, and what a
// disabled debug line costs against no line at all. Each ratio compares two
// benchmarks of the same run.
#include <benchmark/benchmark.h>

#include "BenchContainer.h"
#include "LS_CData.h"
#include "LS_Debug.h"
#include "RatioReporter.h"

namespace {

// A chain of depth + 1 containers; the value lives at the top, twenty other
// values on every level make the tables realistic.
struct Chain {
  explicit Chain(int depth) {
    for (int level = 0; level <= depth; ++level) {
      RefPtr<BenchContainer> container = adoptRef(new BenchContainer);
      for (int i = 0; i < 20; ++i)
        LS_setDataElement<unsigned int>(container.get(), String().format("value-%d-%d", level, i), 1u);
      if (!levels.empty())
        container->setBase(levels.back().get());
      levels.push_back(container);
    }
    LS_setDataElement<unsigned int>(levels.front().get(), "lifetime", 3600u);
  }
  LS_IContainer const* bottom() const { return levels.back().get(); }

  std::vector<RefPtr<BenchContainer>> levels;
};

void readLifetime(benchmark::State& state, int depth) {
  Chain const chain(depth);
  String const key("lifetime");
  for (auto _ : state) {
    unsigned int lifetime = 0;
    LS_getDataElement(chain.bottom(), key, LS_Strategy::LOCAL_OR_BASE, lifetime);
    benchmark::DoNotOptimize(lifetime);
  }
}

void BM_ReadOwnValue(benchmark::State& state) {
  readLifetime(state, 0);
}
void BM_ReadInheritedValueThreeLevelsUp(benchmark::State& state) {
  readLifetime(state, 3);
}
void BM_ReadInheritedValueTenLevelsUp(benchmark::State& state) {
  readLifetime(state, 10);
}

void BM_NoDebugLine(benchmark::State& state) {
  unsigned int counter = 0;
  for (auto _ : state) {
    ++counter;
    benchmark::DoNotOptimize(counter);
  }
}

void BM_DisabledDebugLine(benchmark::State& state) {
  unsigned int counter = 0;
  for (auto _ : state) {
    ++counter;
    LS_DEBUG("LS_CData(%p)::get() -> local value %u\n", LS_ptr(&counter), counter);
    benchmark::DoNotOptimize(counter);
  }
}

BENCHMARK(BM_ReadOwnValue);
BENCHMARK(BM_ReadInheritedValueThreeLevelsUp);
BENCHMARK(BM_ReadInheritedValueTenLevelsUp);
BENCHMARK(BM_NoDebugLine);
BENCHMARK(BM_DisabledDebugLine);

}  // namespace

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  RatioReporter reporter({{"BM_ReadInheritedValueThreeLevelsUp", "BM_ReadOwnValue"},
                          {"BM_ReadInheritedValueTenLevelsUp", "BM_ReadOwnValue"},
                          {"BM_DisabledDebugLine", "BM_NoDebugLine"}});
  benchmark::RunSpecifiedBenchmarks(&reporter);
  benchmark::Shutdown();
  return 0;
}
