#include <bench/rows.h>

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <memory>

namespace {

class Contender : public benchmark::Fixture {
public:
    Contender(std::string const& name, std::function<void(benchmark::State&)> const& loop) : body(loop)
    {
        SetName(name.c_str());
    }

protected:
    void BenchmarkCase(benchmark::State& state) override { body(state); }

private:
    std::function<void(benchmark::State&)> body;
};

}

void AddContender(
    std::string const& row, char const* contender, std::function<void(benchmark::State&)> const& body)
{
    // The registry deletes it.
    benchmark::internal::RegisterBenchmarkInternal(
        std::make_unique<Contender>(row + "/" + contender, body).release())
        ->MeasureProcessCPUTime();  // the library has threads of its own
}

void ExpectSame(bool same, std::string const& row)
{
    if (same) return;
    std::fprintf(stderr, "bench: the contenders of '%s' disagree\n", row.c_str());
    std::exit(1);
}

int main(int argc, char** argv)
{
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    AddRows();
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
}
