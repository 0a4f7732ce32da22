// What a plan is made of: the source as it was when planning began.
#include "host/pieces/Planner.h"
#include "host/convert/Failure.h"
#include "host/pieces/PlanText.h"
#include "tests/support/Folder.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <fstream>
#include <optional>
#include <string>
#include <vector>

namespace {

using movieconv::Category;
using movieconv::Failure;

/// More pictures than are read between two questions whether planning goes on.
std::string ManyPictures() {
    return test_movies::Make("many-pictures.ts",
                             {"-f", "lavfi", "-i", "testsrc=s=32x32:r=50:d=100", "-c:v", "mpeg2video"});
}

/// A recording that goes on for as long as it is looked at.
TEST(Planning, EndsWhereTheSourceEndedWhenItBeganAndTellsThatItGrew) {
    constexpr int kPatience = 20;
    const Folder folder;
    movieconv::Request request;
    request.input = folder / "grows.ts";
    request.output = folder / "out.mp4";
    const std::string movie = ReadFile(ManyPictures());
    WriteFile(request.input, movie);
    int asked = 0;
    const auto grow = [&] {
        std::ofstream(request.input, std::ios::binary | std::ios::app) << movie;
        return ++asked > kPatience;
    };
    std::optional<Failure> failure;
    try {
        movieconv::MakePlan(movieconv::BeginPlan(request, {}), grow);
    } catch (const Failure& thrown) {
        failure = thrown;
    }
    EXPECT_EQ(asked, 1) << "what was added was read, too";
    ASSERT_TRUE(failure);
    EXPECT_EQ(failure->Kind(), Category::kSource);
    EXPECT_NE(failure->Text().find("was written to while it was read"), std::string::npos) << failure->Text();
}

// As two processes do that found none.
TEST(Planning, LeavesAPlanThatCameInBetween) {
    const Folder folder;
    const std::string path = folder / "movie.plan";
    movieconv::Plan first;
    movieconv::Plan second;
    first.output = "first.mp4";
    second.output = "second.mp4";
    EXPECT_TRUE(movieconv::WritePlan(path, first, false));
    EXPECT_FALSE(movieconv::WritePlan(path, second, false));
    EXPECT_NE(ReadFile(path).find("first.mp4"), std::string::npos);
    EXPECT_TRUE(movieconv::WritePlan(path, second, true));
    EXPECT_NE(ReadFile(path).find("second.mp4"), std::string::npos);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"movie.plan"});
}

} // namespace
