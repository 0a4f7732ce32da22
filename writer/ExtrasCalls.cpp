// The functions of the status header for what a set's files carry beside pictures and sound: no exception
// leaves them.
#include "writer/Extras.h"
#include "writer/Guarded.h"
#include "writer/OptionSets.h"
#include "writer/WriterStatus.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

namespace {

using writer::Extras;
using writer::OptionSet;
using writer::OptionSets;

/// Changes what the files of a set carry; 1 when `change` did.
template <typename Change>
int ChangeExtras(uint32_t number, Change change) noexcept {
    return writer::Guarded(0, [&] {
        const std::shared_ptr<OptionSet> set = OptionSets::Instance().Find(number);
        return set && set->ChangeExtras(change) ? 1 : 0;
    });
}

} // namespace

int MWSetTag(uint32_t set, const char* key, const char* value) {
    return ChangeExtras(set, [&](Extras& extras) { return writer::SetTag(extras.tags, key, value); });
}

int MWSetTrackTag(uint32_t set, int track, const char* key, const char* value) {
    return ChangeExtras(set, [&](Extras& extras) {
        writer::TrackLabel* label = writer::FindLabel(extras, track);
        return label != nullptr && writer::SetTag(label->tags, key, value);
    });
}

int MWSetTrackFlags(uint32_t set, int track, int flags) {
    return ChangeExtras(set, [&](Extras& extras) {
        writer::TrackLabel* label = writer::FindLabel(extras, track);
        if (label != nullptr)
            label->flags = flags;
        return label != nullptr;
    });
}

int MWAddTrack(uint32_t set, const WriterTrack* track) {
    return ChangeExtras(set, [&](Extras& extras) { return writer::AddTrack(extras, track); });
}

int64_t MWGetLostCues(uint32_t set, int track) {
    return writer::Guarded<int64_t>(0, [&]() -> int64_t {
        const std::shared_ptr<OptionSet> found = OptionSets::Instance().Find(set);
        const int further = track - kWriterTrackFurther;
        if (!found || further < 0)
            return 0;
        const std::vector<writer::Track>& tracks = found->ExtraParts()->tracks;
        return further < static_cast<int>(tracks.size())
                   ? tracks[static_cast<std::size_t>(further)].lostCues->load()
                   : 0;
    });
}

int MWAddChapter(uint32_t set, int64_t begin, int64_t end, const char* title) {
    return ChangeExtras(set, [&](Extras& extras) {
        if (end <= begin)
            return false;
        extras.chapters.push_back({begin, end, title != nullptr ? title : ""});
        return true;
    });
}

int MWSetCover(uint32_t set, const void* data, int64_t size) {
    return ChangeExtras(set, [&](Extras& extras) {
        extras.cover = writer::MakeCover(data, size);
        return extras.cover.codec != AV_CODEC_ID_NONE;
    });
}

int MWDescribeCover(uint32_t set, const char* fileName, const char* description) {
    return ChangeExtras(set, [&](Extras& extras) {
        extras.cover.fileName = fileName != nullptr ? fileName : "";
        extras.cover.description = description != nullptr ? description : "";
        return extras.cover.codec != AV_CODEC_ID_NONE;
    });
}

int MWAddAttachment(uint32_t set, const char* fileName, const char* mimeType, const void* data,
                    int64_t size) {
    return ChangeExtras(set, [&](Extras& extras) {
        if (fileName == nullptr || *fileName == '\0' || mimeType == nullptr || data == nullptr || size <= 0 ||
            size > INT32_MAX)
            return false;
        const auto* bytes = static_cast<const uint8_t*>(data);
        extras.attachments.push_back(
            {fileName, mimeType, {}, std::make_shared<std::vector<uint8_t>>(bytes, bytes + size)});
        return true;
    });
}

int MWDescribeAttachment(uint32_t set, const char* description) {
    return ChangeExtras(set, [&](Extras& extras) {
        if (extras.attachments.empty())
            return false;
        extras.attachments.back().description = description != nullptr ? description : "";
        return true;
    });
}
