#include "host/pieces/Planner.h"

#include "api/MovieConv.h"
#include "host/convert/Amounts.h"
#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Engine.h"
#include "host/convert/Failure.h"
#include "host/convert/Judgement.h"
#include "host/convert/SizePlan.h"
#include "host/convert/Sources.h"
#include "host/convert/WriterPlan.h"
#include "host/convert/WriterSet.h"
#include "host/pieces/PlanChecks.h"
#include "host/sentence/Say.h"
#include "host/source/MediaTime.h"
#include "media/FourCC.h"
#include "media/MediaWriter.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <utility>

namespace movieconv {
namespace {

constexpr double kLeastPiece = 60; // seconds, unless asked for otherwise

/// The stamps of all pictures that are converted, rising, and where the last one ends.
struct Stamps {
    std::vector<int64_t> times;
    std::vector<bool> repaired; ///< Whether that is not the source's own stamp.
    int64_t end = 0;
    bool clockJumps = false;
};

/// Why no pieces can be made of what is asked for; empty when they can.
std::string Obstacle(const Request& request, const Division& division) {
    if (request.split)
        return "clips are not made of pieces: leave one of both out";
    if (request.noVideo || request.preferences.noVideo || ChooseFormat(request).bHasVideo == 0)
        return "pieces are made of pictures: sound alone is converted undivided";
    if (ChooseFormat(request).fccFormat == FourCC("GIF "))
        return "the pictures of a GIF need the head before the first: it is converted undivided";
    if (request.playlists)
        return "a playlist cannot be converted in pieces: the plan would not notice when its parts change";
    if (division.pieces && (*division.pieces < 1 || *division.pieces > kMostPieces))
        return fmt::format("a movie is divided into 1 to {} pieces", kMostPieces);
    if (division.length && *division.length < 0.001)
        return "a piece (--piece-length) is at least 0.001 seconds long";
    return {};
}

/// To read the stamps of its pictures by.
Request StampRequest(const Plan& plan) {
    Request request = plan.settings;
    request.input = plan.source.path;
    request.output = plan.output;
    request.noAudio = true;
    request.piece.emplace().pictures = false;
    return request;
}

/// Throws Failure where pieces would, after much work.
void RequireAll(const Movie& movie, const Request& request, const Stamps& stamps) {
    const std::string& path = request.input;
    if (const Sentence error = movie.ReadError(); !error.IsEmpty())
        throw Failure(Category::kSource, Say("reading \"{}\" failed: {}", path, error));
    if (movie.UnstampedPictures() > 0)
        throw Failure(
            Category::kSource,
            fmt::format("\"{}\" does not tell when its pictures are shown; it can only be converted "
                        "undivided",
                        path));
    if (stamps.times.empty())
        throw Failure(Category::kSource, fmt::format("\"{}\" holds no pictures to convert", path));
    const double reached = ToSeconds(stamps.end) - request.begin;
    if (const Sentence why = WhyItEndedEarly(movie, request, reached); !why.IsEmpty())
        throw Failure(Category::kSource,
                      Say("reading \"{}\" failed after {}: {}; it can only be converted undivided", path,
                          FormatTime(ToSeconds(stamps.end), true), why));
}

std::optional<Stamps> ReadStamps(Movie& movie, const Request& request, const std::function<bool()>& stopped) {
    constexpr std::size_t kAskEvery = 4096;
    VideoDecoder& pictures = *movie.Pictures();
    if (request.begin > 0)
        pictures.Seek(request.begin, 1);
    if (request.length)
        movie.EndPicturesAt(request.begin + *request.length);
    Stamps stamps;
    for (const VideoImage* picture = pictures.GetCurrentImage(); picture != nullptr;
         picture = pictures.DecodeNext(1) > 0 ? pictures.GetCurrentImage() : nullptr) {
        stamps.times.push_back(+picture->llTime); // a copy: the record is packed
        stamps.repaired.push_back(movie.StampIsRepaired());
        stamps.end = picture->llTime + picture->nDuration;
        if (stamps.times.size() % kAskEvery == 0 && stopped())
            return std::nullopt;
    }
    if (request.length)
        stamps.end = std::min(stamps.end, ToMediaTime(request.begin + *request.length));
    stamps.clockJumps = movie.ClockJumps() > 0;
    RequireAll(movie, request, stamps);
    return stamps;
}

/// Whether a piece that begins with the picture sees the same stamps as who reads from the start: where
/// stamps are put right, they depend on those before.
bool IsCertain(const Stamps& stamps, std::size_t picture) {
    const auto isOwn = [&](std::size_t which) {
        return which >= stamps.repaired.size() || !stamps.repaired[which];
    };
    return isOwn(picture) && isOwn(picture + 1) && (picture == 0 || isOwn(picture - 1));
}

/// The numbers of the pictures with which pieces begin.
std::vector<std::size_t> FirstPictures(const Stamps& stamps, const Division& division) {
    const auto count = static_cast<int64_t>(stamps.times.size());
    const int64_t origin = stamps.times.front();
    std::vector<std::size_t> firsts{0};
    const auto add = [&](std::size_t picture) {
        while (picture < stamps.times.size() && !IsCertain(stamps, picture))
            ++picture;
        if (picture > firsts.back() && picture < stamps.times.size())
            firsts.push_back(picture);
    };
    if (division.pieces) {
        for (int64_t i = 1; i < *division.pieces; ++i)
            add(static_cast<std::size_t>(i * count / *division.pieces));
        return firsts;
    }
    const int64_t whole = stamps.end - origin;
    const int64_t pieces = std::max<int64_t>(1, whole / ToMediaTime(kLeastPiece));
    const int64_t length = division.length ? ToMediaTime(*division.length) : (whole + pieces - 1) / pieces;
    for (std::size_t last = 0;; last = firsts.back()) {
        // From where the last one begins, so that a picture that stands for long makes no empty piece.
        const int64_t passed = (stamps.times[last] - origin) / length;
        const auto next =
            std::lower_bound(stamps.times.begin(), stamps.times.end(), origin + (passed + 1) * length);
        add(static_cast<std::size_t>(next - stamps.times.begin()));
        if (firsts.back() == last)
            return firsts;
    }
}

EncodeParam ParamFor(const Request& request, Movie& movie) {
    const Engine engine = MakeEngine(request, movie.Info(), movie.Pictures(), nullptr);
    EncodeParam param{};
    MCGetEncodeParam(engine.get(), &param);
    return param;
}

std::vector<std::optional<int64_t>> TicksBefore(EncodeParam param, const Request& request, Movie& movie,
                                                const Stamps& stamps) {
    const WriterSet set(OptionsFor(request, movie.Info()));
    param.nReserved[kWriterSetWord] = set.Number();
    const VideoFormat format = movie.Pictures()->GetVideoInfo()->format;
    std::vector<int64_t> times = stamps.times;
    for (int64_t& time : times)
        time -= stamps.times.front();
    std::vector<int64_t> ticks(times.size());
    if (MWPlanTicks(&param, &format, times.data(), static_cast<int64_t>(times.size()), ticks.data()) == 0)
        throw Failure(Category::kInternal, Sentence("the pictures cannot be placed in the output"));
    std::vector<std::optional<int64_t>> before;
    before.reserve(ticks.size());
    for (const int64_t tick : ticks)
        before.push_back(tick == kWriterNoTick ? std::nullopt : std::optional(tick));
    return before;
}

/// What making one piece takes at most: pictures waiting for each other, and the encoder's view of its
/// future.
int64_t MemoryPerPiece(const PictureStreamInfo& pictures) {
    constexpr int64_t kFixed = 40 << 20;
    constexpr int64_t kPicturesHeld = 70;
    return kFixed + kPicturesHeld * pictures.width * pictures.height * 3 / 2;
}

/// Pictures behind its end that the encoder of a piece looks at.
std::size_t PicturesAhead(const EncodeParam& param, const Request& request, const SourceInfo& source) {
    const PictureCoding plan = PlanPictures(request, ChooseFormat(request), *source.pictures);
    const int speed = plan.speed ? static_cast<int>(*plan.speed) : 0;
    return static_cast<std::size_t>(MWPicturesAhead(param.fccVideo, speed));
}

/// The pieces that begin with the pictures `firsts`.
std::vector<Piece> PiecesOf(const Movie& movie, const Stamps& stamps, const std::vector<std::size_t>& firsts,
                            const std::vector<std::optional<int64_t>>& ticks, std::size_t ahead) {
    const auto timeOf = [&](std::size_t picture) {
        return picture < stamps.times.size() ? stamps.times[picture]
                                             : std::max(stamps.end, stamps.times.back() + 1);
    };
    std::vector<Piece> pieces;
    for (std::size_t i = 0; i < firsts.size(); ++i) {
        const std::size_t next = i + 1 < firsts.size() ? firsts[i + 1] : stamps.times.size();
        pieces.push_back({.begin = stamps.times[firsts[i]],
                          .end = timeOf(next),
                          .until = timeOf(next + ahead),
                          .pictures = static_cast<int64_t>(next - firsts[i]),
                          .tick = ticks[firsts[i]],
                          .drawnSince = movie.DrawnSince(stamps.times[firsts[i]])});
    }
    return pieces;
}

} // namespace

Plan BeginPlan(const Request& request, const Division& division) {
    if (const std::string obstacle = Obstacle(request, division); !obstacle.empty())
        throw Failure(Category::kRequest, obstacle);
    Plan plan;
    plan.versions = CurrentVersions();
    plan.source = MarkOf(request.input);
    plan.output = AbsolutePath(request.output);
    plan.division = division;
    plan.settings = request.maxSize ? FitIntoSize(request, LookAtSource(request)) : request;
    if (const SourceInfo source = request.detectCrop ? LookAtSource(request) : SourceInfo{}; source.pictures)
        plan.settings.crop = source.pictures->crop;
    plan.settings.detectCrop = false;
    plan.settings.format = ChooseFormat(request).fccFormat;
    plan.settings.preview.reset();
    plan.settings.input.clear();
    plan.settings.output.clear();
    plan.texts = MarkTexts(plan.settings);
    return plan;
}

std::optional<Plan> MakePlan(Plan plan, const std::function<bool()>& stopped) {
    const Request request = StampRequest(plan);
    Movie movie = OpenMovie(request);
    if (!movie.Info().pictures)
        throw Failure(Category::kSource,
                      fmt::format("\"{}\" holds no pictures that could be divided", plan.source.path));
    LengthToConvert(request, movie.Info()); // refuses a begin behind the end
    const std::optional<Stamps> stamps = ReadStamps(movie, request, stopped);
    if (!stamps)
        return std::nullopt;
    if (MarkOf(plan.source.path) != plan.source)
        throw Failure(Category::kSource,
                      fmt::format("\"{}\" was written to while it was read", plan.source.path));
    plan.fromStart = stamps->clockJumps;
    plan.hasRates = HasRates(request, ChooseFormat(request), movie.Info());
    plan.memory = MemoryPerPiece(*movie.Info().pictures);
    const std::vector<std::size_t> firsts = FirstPictures(*stamps, plan.division);
    if (firsts.size() > std::size_t{kMostPieces})
        throw Failure(Category::kRequest, fmt::format("that makes {} pieces; at most {} can be made",
                                                      firsts.size(), kMostPieces));
    const EncodeParam param = ParamFor(request, movie);
    plan.pictures = PiecesOf(movie, *stamps, firsts, TicksBefore(param, request, movie, *stamps),
                             PicturesAhead(param, request, movie.Info()));
    return plan;
}

std::string TellBitRate(const Plan& plan) {
    if (!plan.hasRates || plan.pictures.size() == 1)
        return {};
    const double seconds = ToSeconds(plan.pictures.back().end - plan.pictures.front().begin) /
                           static_cast<double>(plan.pictures.size());
    return fmt::format(
        "the bit rate begins anew in each of {} pieces of {:.0f} s: pieces below 20 s make the "
        "output larger by more than 4 %; a constant quality does not",
        plan.pictures.size(), seconds);
}

} // namespace movieconv
