#include "bench/colour/Table.h"

#include <iomanip>
#include <ostream>
#include <sstream>

namespace bench {
namespace {

std::vector<std::string> partsOf(const std::string& name) {
    std::vector<std::string> parts;
    std::istringstream stream(name);
    for (std::string part; std::getline(stream, part, '/');)
        parts.push_back(part);
    return parts;
}

double counter(const benchmark::BenchmarkReporter::Run& run, const char* name) {
    const auto found = run.counters.find(name);
    return found == run.counters.end() ? 0 : static_cast<double>(found->second);
}

} // namespace

bool TableReporter::ReportContext(const Context&) {
    return true;
}

void TableReporter::ReportRuns(const std::vector<Run>& runs) {
    for (const Run& run : runs) {
        const std::vector<std::string> parts = partsOf(run.run_name.function_name);
        const std::string title = parts[0] + ", " + parts[1];
        if (title != title_ || parts[2] != routine_)
            printRow();
        const bool startsTable = title != title_;
        title_ = title;
        routine_ = parts[2];
        if (startsTable)
            GetOutputStream() << '\n' << title_ << '\n';
        row_.push_back({parts[3], counter(run, "ratio"), counter(run, "goal")});
    }
}

void TableReporter::Finalize() {
    printRow();
}

void TableReporter::printRow() {
    if (row_.empty())
        return;
    std::ostream& out = GetOutputStream();
    out << "  " << std::left << std::setw(26) << routine_ << std::right << std::fixed << std::setprecision(2);
    for (const Cell& cell : row_)
        out << std::setw(12) << cell.size << std::setw(7) << cell.ratio
            << (cell.ratio < cell.goal ? '*' : ' ');
    out << std::endl;
    row_.clear();
}

} // namespace bench
