// Every kernel of every level that this machine has against the plain kernel: the same bytes, and not one
// byte read or written outside the rows.
#include "tests/image/GuardedMemory.h"
#include "tests/image/KernelCases.h"
#include "tests/image/Levels.h"

#include <algorithm>
#include <memory>
#include <random>
#include <vector>

namespace {

using namespace image;

enum class Content { kRandom, kExtremes };

constexpr size_t kMaxRows = 6;
constexpr size_t kMaxWidth = 400;

class RowKernelsTest : public LevelTest {
protected:
    RowKernelsTest() {
        for (auto& memory : sources)
            memory = std::make_unique<GuardedMemory>(4 * kMaxWidth);
        for (auto& memory : targets)
            memory = std::make_unique<GuardedMemory>(4 * kMaxWidth);
    }

    void Fill(std::span<uint8_t> bytes, Content content) {
        for (uint8_t& byte : bytes) {
            const auto bits = static_cast<uint8_t>(random() >> 13);
            byte = content == Content::kRandom ? bits : static_cast<uint8_t>(bits % 2 * 255);
        }
    }

    /// Runs the level's kernel and the plain one on the same rows. With `oneRow` the rows of a pair are the
    /// same row.
    void Compare(const RowKernels& level, const KernelCase& kernel, size_t width, Placement placement,
                 Content content, bool oneRow) {
        const auto isSecond = [](size_t i) { return i == 1 || i == 5; };
        const uint8_t* source[kMaxRows]{};
        for (size_t i = 0; i < kernel.sources.size(); ++i) {
            const auto block = sources[i]->Block(kernel.sources[i](width), placement);
            Fill(block, content);
            source[i] = oneRow && i == 1 ? source[0] : block.data();
        }
        uint8_t* target[kMaxRows]{};
        uint8_t* plainTarget[kMaxRows]{};
        std::vector<uint8_t> plain[kMaxRows];
        for (size_t i = 0; i < kernel.targets.size(); ++i) {
            const auto block = targets[i]->Block(kernel.targets[i](width), placement);
            Fill(block, content);
            plain[i].assign(block.begin(), block.end());
            const bool shared = oneRow && isSecond(i);
            target[i] = shared ? target[i - 1] : block.data();
            plainTarget[i] = shared ? plainTarget[i - 1] : plain[i].data();
        }

        kernel.run(level, target, source, static_cast<ptrdiff_t>(width));
        kernel.run(*RowKernelsFor(KernelLevel::kPlain), plainTarget, source, static_cast<ptrdiff_t>(width));

        for (size_t i = 0; i < kernel.targets.size(); ++i) {
            ASSERT_TRUE(targets[i]->GuardsIntact()) << "wrote outside target row " << i;
            const size_t bytes = plain[i].size();
            const auto firstWrong =
                std::mismatch(plainTarget[i], plainTarget[i] + bytes, target[i]).second - target[i];
            ASSERT_EQ(static_cast<size_t>(firstWrong), bytes) << "first wrong byte of target row " << i;
        }
    }

    void CompareAll(size_t width) {
        for (const KernelCase& kernel : KernelCases()) {
            if (width % kernel.widthStep != 0)
                continue;
            for (const Placement placement : kPlacements) {
                for (const Content content : {Content::kRandom, Content::kExtremes}) {
                    for (const bool oneRow : {false, true}) {
                        Compare(*kernels, kernel, width, placement, content, oneRow);
                        const bool suitsLarge =
                            width % kLargeWidthStep == 0 && placement != Placement::kMisaligned && width > 0;
                        if (kernels->large != nullptr && suitsLarge && !HasFatalFailure())
                            Compare(*kernels->large, kernel, width, placement, content, oneRow);
                        if (HasFatalFailure()) {
                            FAIL() << kernel.name << ", width " << width << ", placement "
                                   << static_cast<int>(placement) << ", content " << static_cast<int>(content)
                                   << (oneRow ? ", one row" : "");
                        }
                    }
                }
            }
        }
    }

    std::mt19937 random{20061};
    std::unique_ptr<GuardedMemory> sources[kMaxRows];
    std::unique_ptr<GuardedMemory> targets[kMaxRows];
};

TEST_P(RowKernelsTest, EveryWidthOfAFewVectors) {
    for (size_t width = 0; width <= 200 && !HasFatalFailure(); ++width)
        CompareAll(width);
}

TEST_P(RowKernelsTest, WiderRows) {
    for (size_t width = 255; width <= kMaxWidth && !HasFatalFailure(); width += 13)
        CompareAll(width);
}

INSTANTIATE_TEST_SUITE_P(Levels, RowKernelsTest, testing::ValuesIn(kKernelLevels), LevelName);

} // namespace
