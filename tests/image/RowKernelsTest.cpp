// Every kernel of every level that this machine has against the plain kernel: the same bytes, and not one
// byte read or written outside the rows.
#include "tests/image/GuardedMemory.h"
#include "tests/image/KernelCases.h"
#include "tests/image/Levels.h"

#include <algorithm>
#include <random>
#include <vector>

namespace {

using namespace image;

enum class Content { kRandom, kExtremes };

constexpr size_t kMaxRows = 6;
constexpr size_t kMaxWidth = 400;

class RowKernelsTest : public LevelTest {
protected:
    struct RowMemory : GuardedMemory {
        RowMemory() : GuardedMemory(4 * kMaxWidth) {}
    };

    void Fill(std::span<uint8_t> bytes, Content content) {
        for (uint8_t& byte : bytes) {
            const auto bits = static_cast<uint8_t>(random() >> 13);
            byte = content == Content::kRandom ? bits : static_cast<uint8_t>(bits % 2 * 255);
        }
    }

    /// Runs the level's kernel and the plain one on the same rows.
    void Compare(const RowKernels& level, const KernelCase& kernel, Size size, Placement placement,
                 Content content) {
        const auto width = static_cast<size_t>(size.width);
        uint8_t* source[kMaxRows]{};
        for (size_t i = 0; i < kernel.sources.size(); ++i) {
            const auto block = sources[i].Block(kernel.sources[i](width), placement);
            Fill(block, content);
            source[i] = block.data();
        }
        uint8_t* target[kMaxRows]{};
        uint8_t* plainTarget[kMaxRows]{};
        std::vector<uint8_t> plain[kMaxRows];
        for (size_t i = 0; i < kernel.targets.size(); ++i) {
            const auto block = targets[i].Block(kernel.targets[i](width), placement);
            Fill(block, content);
            target[i] = block.data();
            plain[i].assign(block.begin(), block.end());
            plainTarget[i] = plain[i].data();
        }

        kernel.run(level, target, source, size);
        kernel.run(*RowKernelsFor(KernelLevel::kPlain), plainTarget, source, size);

        for (size_t i = 0; i < kernel.targets.size(); ++i) {
            ASSERT_TRUE(targets[i].GuardsIntact()) << "wrote outside target row " << i;
            const auto firstWrong =
                std::mismatch(plain[i].begin(), plain[i].end(), target[i]).first - plain[i].begin();
            ASSERT_EQ(static_cast<size_t>(firstWrong), plain[i].size())
                << "first wrong byte of target row " << i;
        }
    }

    void CompareAll(size_t width) {
        for (const KernelCase& kernel : KernelCases()) {
            if (width % kernel.widthStep != 0)
                continue;
            for (const Placement placement : kPlacements) {
                for (const Content content : {Content::kRandom, Content::kExtremes}) {
                    for (const ptrdiff_t height : {1, 2}) {
                        const Size size{static_cast<ptrdiff_t>(width), height};
                        Compare(*kernels, kernel, size, placement, content);
                        const bool suitsLarge =
                            width % kLargeWidthStep == 0 && placement != Placement::kMisaligned && width > 0;
                        if (kernels->large != nullptr && suitsLarge && !HasFatalFailure())
                            Compare(*kernels->large, kernel, size, placement, content);
                        if (HasFatalFailure()) {
                            FAIL() << kernel.name << ", width " << width << ", placement "
                                   << static_cast<int>(placement) << ", content " << static_cast<int>(content)
                                   << ", rows " << height;
                        }
                    }
                }
            }
        }
    }

    std::mt19937 random{20061};
    RowMemory sources[kMaxRows], targets[kMaxRows];
};

TEST_P(RowKernelsTest, EveryWidthOfAFewVectorsAndSomeWiderRows) {
    for (size_t width = 0; width <= kMaxWidth && !HasFatalFailure(); width += width < 200 ? 1 : 13)
        CompareAll(width);
}

INSTANTIATE_TEST_SUITE_P(Levels, RowKernelsTest, testing::ValuesIn(AllKernels()), KernelsName);

} // namespace
