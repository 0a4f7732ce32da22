// What is seen at joints: the pictures around them come as near to the source as those of an undivided
// conversion.
#include "tests/support/Folder.h"
#include "tests/support/Program.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <fmt/format.h>
#include <fstream>
#include <string>
#include <vector>

namespace {

using program::Call;
using test_movies::Args;
using test_movies::Join;

constexpr int kRate = 25;
constexpr int kPiecePictures = 5 * kRate; // where an undivided conversion has key pictures, too
constexpr double kMostLoss = 0.3;         // dB

/// The mean square error of the luma of each picture.
std::vector<double> Errors(const std::string& movie, const std::string& source, const Folder& folder) {
    const std::string list = folder / "errors";
    const program::Result result = program::Run(
        {"ffmpeg", "-v", "fatal", "-nostdin", "-i", movie, "-i", source, "-lavfi",
         "[0:v]setpts=N/25/TB[a];[1:v]setpts=N/25/TB[b];[a][b]psnr=stats_file=" + list, "-f", "null", "-"});
    EXPECT_EQ(result.code, 0) << result.err;
    std::ifstream lines(list);
    std::vector<double> errors;
    for (std::string word; lines >> word;)
        if (word.starts_with("mse_y:"))
            errors.push_back(std::stod(word.substr(6)));
    return errors;
}

/// In dB, over so many pictures before and after each joint.
double QualityAtJoints(const std::vector<double>& errors) {
    constexpr int kAround = 4;
    double sum = 0;
    int count = 0;
    for (std::size_t joint = kPiecePictures; joint + kAround < errors.size(); joint += kPiecePictures)
        for (std::size_t picture = joint - kAround; picture < joint + kAround; ++picture, ++count)
            sum += errors[picture];
    return 10 * std::log10(255 * 255 * count / sum);
}

struct Case {
    const char* name;
    Args options;
};

class Joints : public testing::TestWithParam<Case> {};

TEST_P(Joints, AreNotSeen) {
    const std::string source = test_movies::Make(
        "joints.mkv", {"-f", "lavfi", "-i", "testsrc2=s=320x240:r=25:d=21", "-c:v", "ffv1"});
    const Folder folder;
    const std::string whole = folder / "whole.mkv";
    const std::string pieces = folder / "pieces.mkv";
    const Args options = Join(Args{"-q", "--preset", "standard"}, GetParam().options);
    // As one piece: with as many encoder threads as processors, the bytes would depend on these.
    ASSERT_EQ(Call(Join(options, Args{"--jobs", "1", "--pieces", "1", source, whole})).code, 0);
    ASSERT_EQ(Call(Join(options, Args{"--jobs", "2", "--piece-length", "5", source, pieces})).code, 0);
    const std::vector<double> undivided = Errors(whole, source, folder);
    const std::vector<double> joined = Errors(pieces, source, folder);
    ASSERT_EQ(joined.size(), undivided.size());
    ASSERT_EQ(joined.size(), std::size_t{21 * kRate});
    const double loss = QualityAtJoints(undivided) - QualityAtJoints(joined);
    RecordProperty("loss", fmt::format("{:.2f}", loss));
    EXPECT_LE(loss, kMostLoss);
}

INSTANTIATE_TEST_SUITE_P(Of, Joints,
                         testing::Values(Case{"H264", {"--speed", "faster"}},
                                         Case{"Hevc", {"--video-codec", "HEVC", "--speed", "faster"}},
                                         Case{"Mpeg4", {"--video-codec", "XVID"}}),
                         [](const auto& info) { return info.param.name; });

} // namespace
