// Prints the results as one table for each question and level: a row for each routine, a column for each
// size.
#ifndef MOVIECONV_BENCH_COLOUR_TABLE_H
#define MOVIECONV_BENCH_COLOUR_TABLE_H

#include <benchmark/benchmark.h>
#include <string>
#include <vector>

namespace bench {

/// Expects benchmarks named "question/level/routine/size" with the counters `ratio` and, where there is one,
/// `goal`.
class TableReporter : public benchmark::BenchmarkReporter {
public:
    bool ReportContext(const Context& context) override;
    void ReportRuns(const std::vector<Run>& runs) override;
    void Finalize() override;

private:
    struct Cell {
        std::string size;
        double ratio;
        double goal;
    };
    void printRow();

    std::string title_;
    std::string routine_;
    std::vector<Cell> row_;
};

} // namespace bench

#endif
