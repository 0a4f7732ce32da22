// Measures the colour routines against libyuv and against one another, one thread, every pair of figures in
// turns. All results are ratios: more is better, and a star marks those short of the goal.
#include "bench/colour/Compare.h"
#include "bench/colour/Exactness.h"
#include "bench/colour/Families.h"
#include "bench/colour/Levels.h"
#include "bench/colour/PeerErrors.h"
#include "bench/colour/Table.h"

#include <algorithm>
#include <cstdio>
#include <libyuv/version.h>
#include <map>
#include <string>
#include <string_view>
#include <utility>

namespace {
#ifdef __clang__
constexpr char kCompiler[] = __VERSION__;
#else
constexpr char kCompiler[] = "GCC " __VERSION__;
#endif
} // namespace

namespace bench {
namespace {

/// The pictures of a size, made when first asked for.
Pictures& picturesOf(int width, int height) {
    static std::map<std::pair<int, int>, Pictures> made;
    return made.try_emplace({width, height}, width, height).first->second;
}

struct Size {
    int width;
    int height;
};

std::string nameOf(const Size& size) {
    return std::to_string(size.width) + 'x' + std::to_string(size.height);
}

/// Registers one figure of a table; `body` compares the routine with something in the pictures of that size.
template <class Body>
void add(const std::string& question, const Level& level, const Family& family, const Size& size, double goal,
         Body body) {
    const std::string name = question + '/' + level.name + '/' + family.name + '/' + nameOf(size);
    benchmark::RegisterBenchmark(name.c_str(),
                                 [=, &family](benchmark::State& state) {
                                     use(level);
                                     body(state, family, picturesOf(size.width, size.height));
                                     state.counters["goal"] = goal;
                                 })
        ->UseManualTime()
        ->MinTime(0.3);
}

void addAgainstPeer(const Level& level, const Family& family) {
    for (std::size_t i = 0; i < std::size(kSizes); ++i)
        add("Times faster than libyuv", level, family, {kSizes[i][0], kSizes[i][1]}, family.goals[i],
            [](benchmark::State& state, const Family& f, Pictures& p) {
                compare(
                    state, [&] { f.ours(p); }, [&] { f.peer(p); });
            });
}

void addAgainstAccurate(const Level& level, const Family& family) {
    for (const auto& [width, height] : kSizes)
        add("Times faster than swscale, accurate", level, family, {width, height}, 0,
            [](benchmark::State& state, const Family& f, Pictures& p) {
                compare(
                    state, [&] { f.ours(p); }, [&] { f.accurate(p); });
            });
}

/// An odd size shall take at most 5 % longer than the even one that is a column and a row larger.
void addOddAgainstEven(const Level& level, const Family& family) {
    constexpr Size kOddSizes[] = {{321, 241}, {641, 479}, {1921, 1079}};
    for (const Size& odd : kOddSizes)
        add("Odd size against the next even one", level, family, odd, 1 / 1.05,
            [](benchmark::State& state, const Family& f, Pictures& p) {
                Pictures& even = picturesOf(p.width + 1, p.height + 1);
                compare(
                    state, [&] { f.ours(p); }, [&] { f.ours(even); });
            });
}

/// A tiny picture shall cost at most three times as much a pixel as a large one.
void addTinyAgainstLarge(const Level& level, const Family& family) {
    add("A pixel of a tiny picture against one of 1920x1080", level, family, {16, 16}, 1 / 3.0,
        [](benchmark::State& state, const Family& f, Pictures& p) {
            Pictures& large = picturesOf(1920, 1080);
            compare(
                state, [&] { f.ours(p); }, [&] { f.ours(large); }, p.pixels() / large.pixels());
        });
}

void addAgainstPlain(const Level& level, const Level& plain, const Family& family, double goal) {
    add("Times faster than the plain kernels", level, family, {1920, 1080}, goal,
        [=](benchmark::State& state, const Family& f, Pictures& p) {
            // Both set their level, so that both pay for it.
            auto on = [&](const Level& wanted) {
                return [&] {
                    image::ForceRowKernels(wanted.kernels);
                    f.ours(p);
                };
            };
            compare(state, on(level), on(plain));
        });
}

void addAll(const std::vector<Level>& levels) {
    constexpr double kLowestLevelGain = 4.5;
    const Level& plain = levels.front();
    const Level& best = levels.back();
    for (std::size_t i = levels.size() - 1; i > 0; --i) {
        for (const Family& family : families())
            addAgainstPeer(levels[i], family);
        for (const Family& family : families()) {
            const bool asksForGain = i == 1 && family.kind != Kind::Move;
            addAgainstPlain(levels[i], plain, family, asksForGain ? kLowestLevelGain : 0);
        }
    }
    for (const Family& family : families())
        if (family.accurate != nullptr)
            addAgainstAccurate(best, family);
    for (const Family& family : families())
        addOddAgainstEven(best, family);
    for (const Family& family : families())
        addTinyAgainstLarge(best, family);
}

/// Takes an option of this program's own out of the arguments.
bool takeOption(int& count, char** arguments, std::string_view option) {
    char** const end = arguments + count;
    char** const kept =
        std::remove_if(arguments, end, [=](const char* argument) { return argument == option; });
    count = static_cast<int>(kept - arguments);
    return kept != end;
}

} // namespace
} // namespace bench

int main(int argc, char** argv) {
    const std::vector<bench::Level> levels = bench::levels();
    const bool check = !bench::takeOption(argc, argv, "--no-check");
    bench::addAll(levels);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 2;

    std::printf("compiler: %s\nlibyuv: %d\n", kCompiler, LIBYUV_VERSION);
    if (check) {
        if (!bench::checkExactness(levels))
            return 1;
        std::printf("exact over all colours on:");
        for (const bench::Level& level : levels)
            std::printf(" %s", level.name);
        std::printf("\n");
        bench::printPeerErrors();
    }
    std::fflush(stdout);
    bench::TableReporter table;
    benchmark::RunSpecifiedBenchmarks(&table);
    return 0;
}
