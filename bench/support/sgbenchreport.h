#pragma once

// Reporting shared by the benchmark programs. The machines these run on are shared and noisy,
// so every figure is a ratio against a baseline measured in the same run, taken over several
// repetitions: the median (the figure to quote) and the fastest (the least disturbed).
//
//   sgBenchInitialize(argc, argv);                 // repetitions interleaved at random
//   SgBenchReporter reporter;                      // CPU time per iteration (or RealTime)
//   benchmark::RunSpecifiedBenchmarks(&reporter);
//   sgPrintRatio("write / memcpy", reporter.median("BM_Write/64"),
//                reporter.median("BM_Memcpy"), 2.0);
//
// A benchmark is named by its function name and its arguments ("BM_Write/256"), whatever
// options (iterations, repetitions, minimum time) it runs with.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdio>
#include <map>
#include <string>
#include <vector>

// Initializes Google Benchmark with the repetitions of all benchmarks run in a random
// interleaved order, so that a change in the machine's load falls on both sides of a ratio
// (the command line can still say otherwise).
inline void sgBenchInitialize(int &argc, char **argv) {
    static char interleave[] = "--benchmark_enable_random_interleaving=true";
    std::vector<char *> args(argv, argv + argc);
    args.insert(args.begin() + (argc > 0 ? 1 : 0), interleave);
    int count = int(args.size());
    args.push_back(nullptr);
    benchmark::Initialize(&count, args.data());
    benchmark::ReportUnrecognizedArguments(count, args.data());
}

// The median of `samples` (the mean of the middle two for an even count); 0 when empty.
inline double sgMedian(std::vector<double> samples) {
    if (samples.empty())
        return 0.0;
    std::sort(samples.begin(), samples.end());
    const size_t half = samples.size() / 2;
    return samples.size() % 2 ? samples[half] : 0.5 * (samples[half - 1] + samples[half]);
}

// The smallest of `samples`; 0 when empty.
inline double sgFastest(const std::vector<double> &samples) {
    return samples.empty() ? 0.0 : *std::min_element(samples.begin(), samples.end());
}

// Prints one ratio line, "label  ratio  (target <= t) met", and returns whether the target is
// met. With `atLeast` the target is a floor instead of a ceiling; a target of 0 prints the ratio
// alone. Prints nothing and returns false when either time is missing.
inline bool sgPrintRatio(const char *label, double measured, double baseline, double target = 0.0,
                         bool atLeast = false) {
    if (measured <= 0.0 || baseline <= 0.0)
        return false;
    const double ratio = measured / baseline;
    if (target <= 0.0) {
        std::printf("%-48s %7.3f\n", label, ratio);
        return true;
    }
    const bool met = atLeast ? ratio >= target : ratio <= target;
    std::printf("%-48s %7.3f  (target %s %.2f) %s\n", label, ratio, atLeast ? ">=" : "<=", target,
                met ? "met" : "NOT MET");
    return met;
}

// Prints the console table as usual and keeps every repetition's seconds per iteration.
class SgBenchReporter : public benchmark::ConsoleReporter {
public:
    enum Clock { CpuTime, RealTime };
    explicit SgBenchReporter(Clock clock = CpuTime) : m_clock(clock) {}

    void ReportRuns(const std::vector<Run> &runs) override {
        for (const Run &run : runs) {
            if (run.error_occurred || run.run_type != Run::RT_Iteration || run.iterations <= 0)
                continue;
            m_samples[CpuTime][nameOf(run)].push_back(run.cpu_accumulated_time /
                                                      double(run.iterations));
            m_samples[RealTime][nameOf(run)].push_back(run.real_accumulated_time /
                                                       double(run.iterations));
            for (const auto &[counter, value] : run.counters)
                m_counters[nameOf(run) + "#" + counter].push_back(value.value);
        }
        ConsoleReporter::ReportRuns(runs);
    }

    // Seconds per iteration of each repetition of `name`, in the order they ran, on the
    // reporter's clock or on `clock`.
    std::vector<double> samples(const std::string &name) const { return samples(name, m_clock); }
    std::vector<double> samples(const std::string &name, Clock clock) const {
        const auto found = m_samples[clock].find(name);
        return found == m_samples[clock].end() ? std::vector<double>() : found->second;
    }
    double median(const std::string &name) const { return sgMedian(samples(name)); }
    double median(const std::string &name, Clock clock) const {
        return sgMedian(samples(name, clock));
    }
    double fastest(const std::string &name) const { return sgFastest(samples(name)); }
    // The median over the repetitions of a benchmark's user counter (state.counters[counter]).
    double counterMedian(const std::string &name, const std::string &counter) const {
        const auto found = m_counters.find(name + "#" + counter);
        return found == m_counters.end() ? 0.0 : sgMedian(found->second);
    }

private:
    static std::string nameOf(const Run &run) {
        return run.run_name.args.empty() ? run.run_name.function_name
                                         : run.run_name.function_name + "/" + run.run_name.args;
    }

    Clock m_clock;
    std::map<std::string, std::vector<double>> m_samples[2];
    std::map<std::string, std::vector<double>> m_counters;
};
