// Which level the routines use, and who may choose it.
#include "Common/Image/ImageConvert.h"
#include "Common/Image/kernels/RowKernels.h"

#include <cstdlib>
#include <string>

#include <gtest/gtest.h>

namespace {

using namespace image;

class LevelChoiceTest : public testing::Test {
protected:
    LevelChoiceTest() {
        if (const char* level = std::getenv(kLevelVariable))
            before = level;
    }
    ~LevelChoiceTest() override {
        if (before.empty())
            unsetenv(kLevelVariable);
        else
            setenv(kLevelVariable, before.c_str(), 1);
        ForceRowKernels({});
    }

    /// The level of a process that starts with the variable set so; unset when it is null.
    static std::string LevelWhenAskedFor(const char* wanted) {
        if (wanted == nullptr)
            unsetenv(kLevelVariable);
        else
            setenv(kLevelVariable, wanted, 1);
        ForceRowKernels({});
        return ImageConvertLevel();
    }

private:
    std::string before;
};

TEST_F(LevelChoiceTest, TheVariableNamesOneOfThoseThatThereAre) {
    const std::string best = LevelWhenAskedFor(nullptr);
    for (const auto& [level, name] : kKernelLevels) {
        const bool there = RowKernelsFor(level) != nullptr;
        EXPECT_EQ(LevelWhenAskedFor(name), there ? name : best);
        EXPECT_EQ(&BestRowKernels() == RowKernelsFor(level), there || best == name) << name;
    }
    for (const char* const unknown : {"", "Plain", "plain ", "avx1024"})
        EXPECT_EQ(LevelWhenAskedFor(unknown), best) << unknown;
}

TEST_F(LevelChoiceTest, WithoutAWishTheHighestIsUsed) {
    std::string highest;
    for (const auto& [level, name] : kKernelLevels)
        if (RowKernelsFor(level) != nullptr)
            highest = name;
    EXPECT_EQ(LevelWhenAskedFor(nullptr), highest);
}

TEST_F(LevelChoiceTest, ALaterChangeOfTheVariableHasNoEffect) {
    const std::string first = LevelWhenAskedFor("plain");
    unsetenv(kLevelVariable);
    EXPECT_EQ(ImageConvertLevel(), first);
}

} // namespace
