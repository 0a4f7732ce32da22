#include "host/pieces/PlanChecks.h"

#include "host/convert/Failure.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libswresample/swresample.h>
#include <libswscale/swscale.h>
}

#include <fmt/format.h>

namespace movieconv {
namespace {

std::string VersionText(unsigned version) {
    return fmt::format("{}.{}.{}", version >> 16, version >> 8 & 0xFF, version & 0xFF);
}

void CheckUnchanged(const SourceMark& planned, const char* kind) {
    const SourceMark now = MarkOf(planned.path);
    std::string what;
    if (now.bytes != planned.bytes)
        what = fmt::format("it has {} bytes, not {}", now.bytes, planned.bytes);
    else if (now.head != planned.head || now.tail != planned.tail)
        what = "it holds something else";
    else if (now.modified != planned.modified)
        what = "it was written to since";
    if (!what.empty())
        throw Failure(Category::kSource,
                      fmt::format("\"{}\" is not {} that was planned with: {}", planned.path, kind, what));
}

} // namespace

std::map<std::string, std::string> CurrentVersions() {
    return {{"movieconv", VersionText(MWGetVersion())},
            {"libavcodec", VersionText(avcodec_version())},
            {"libavformat", VersionText(avformat_version())},
            {"libavutil", VersionText(avutil_version())},
            {"libswscale", VersionText(swscale_version())},
            {"libswresample", VersionText(swresample_version())}};
}

void CheckAgainst(const Plan& plan) {
    CheckUnchanged(plan.source, "the source");
    for (const SourceMark& text : plan.texts)
        CheckUnchanged(text, "the file of subtitles");
    for (const auto& [name, version] : CurrentVersions()) {
        const auto planned = plan.versions.find(name);
        if (planned == plan.versions.end() || planned->second != version)
            throw Failure(Category::kRequest,
                          fmt::format("the plan was made with {} {}, here is {}: the pieces would not fit",
                                      name, planned == plan.versions.end() ? "unknown" : planned->second,
                                      version));
    }
}

} // namespace movieconv
