#include "host/window/runner/Foresight.h"

#include "host/convert/CarryPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Room.h"
#include "host/convert/Sources.h"
#include "host/presets/Preset.h"
#include "host/window/model/Entry.h"
#include "host/window/model/Words.h"
#include "host/window/runner/LibraryWords.h"
#include "host/window/runner/SourceFacts.h"
#include "host/window/runner/Translation.h"
#include "text/Path.h"

#include <QCoreApplication>

#include <filesystem>
#include <map>
#include <system_error>
#include <unistd.h>

namespace movieconv::window {
namespace {

struct ForesightTexts {
    Q_DECLARE_TR_FUNCTIONS(Foresight)
};

void WarnOfTarget(Findings& findings, const Order& order) {
    namespace fs = std::filesystem;
    std::error_code unknown;
    const std::string existing = ExistingFileOf(order);
    findings.targetExists = !existing.empty();
    if (findings.targetExists && fs::equivalent(order.source, existing, unknown))
        findings.warnings +=
            ForesightTexts::tr("The new file cannot take the place of its source. Choose another name.");
    else if (findings.targetExists && !order.replace && existing != order.target)
        findings.warnings += ForesightTexts::tr("There is a file “%1” already.").arg(NameOf(existing));
    else if (findings.targetExists && !order.replace)
        findings.warnings += ForesightTexts::tr("There is a file of this name already.");
    else if (findings.targetExists)
        findings.warnings += ForesightTexts::tr("The file that exists will be replaced.");
}

void WarnOfFiles(Findings& findings, const Wishes& wishes) {
    std::vector<std::string> files;
    for (const SubtitleFile& file : wishes.subtitleFiles)
        files.push_back(file.path);
    if (!wishes.burning.file.empty())
        files.push_back(wishes.burning.file);
    std::error_code unknown;
    for (const std::string& path : files)
        if (!std::filesystem::is_regular_file(path, unknown))
            findings.warnings += ForesightTexts::tr("The subtitles “%1” were not found.").arg(Shown(path));
}

/// Wishes that others make void.
void TellWhatHasNoEffect(Findings& findings, const Wishes& wishes, const Request& request) {
    if (request.copySound && !request.noAudio && wishes.channels)
        findings.notes += ForesightTexts::tr("The sound stays as it is, and so do its channels.");
    if (request.noVideo && wishes.burning.IsWanted())
        findings.notes += ForesightTexts::tr("Without pictures, no subtitles are drawn.");
}

/// What the library is going to refuse, and what it is going to leave behind.
void WarnOfContent(Findings& findings, const Order& order, const Request& request) {
    const SourceInfo* known = InfoBehind(order.facts);
    if (known == nullptr)
        return;
    try {
        const FileFormatInfo& format = ChooseFormat(request);
        const SourceInfo source = AsAskedFor(*known, request);
        PlanEncoding(EncodeParam{}, format, request, source);
        QStringList left;
        for (const NotCarried& what : ForetellLeftBehind(source, request, format))
            left += LineOf(what);
        if (!left.isEmpty())
            findings.notes += ForesightTexts::tr("Not carried over:") + QStringLiteral("\n• ") +
                              left.join(QStringLiteral("\n• "));
    } catch (const Failure& failure) {
        findings.warnings += SentenceOf(failure.Words());
    }
}

void WarnOfRoom(Findings& findings, const Order& order, const Request& request, const std::string& folder) {
    const double seconds = request.length.value_or(order.facts.seconds - request.begin);
    findings.needed = static_cast<int64_t>(seconds * EstimatedRate(order, request) / 8);
    const int64_t free = FreeBytes(folder);
    if (free < 0)
        return;
    findings.free = free;
    if (free < *findings.needed) {
        findings.warnings += ForesightTexts::tr("About %1 are needed, but only %2 are free in “%3”.")
                                 .arg(BytesText(*findings.needed), BytesText(free), Shown(folder));
    }
}

} // namespace

/// A movie that is cut into clips becomes files with a number in their names, and none without.
std::string ExistingFileOf(const Order& order) {
    if (order.wishes.clip) {
        const std::map<int, std::string> clips = ClipsOf(order.target);
        return clips.empty() ? std::string() : clips.begin()->second;
    }
    std::error_code unknown;
    const bool exists = std::filesystem::exists(std::filesystem::symlink_status(order.target, unknown));
    return exists ? order.target : std::string();
}

Findings Foresee(const Order& order) {
    Findings findings;
    std::error_code unknown;
    const std::string folder = text::FolderOf(order.target);
    WarnOfTarget(findings, order);
    if (!std::filesystem::is_directory(folder, unknown)) {
        findings.warnings += ForesightTexts::tr("There is no folder “%1”.").arg(Shown(folder));
        return findings;
    }
    if (access(folder.c_str(), W_OK | X_OK) != 0)
        findings.warnings += ForesightTexts::tr("You may not write to the folder “%1”.").arg(Shown(folder));
    try {
        const Request request = ToRequest(order);
        WarnOfFiles(findings, order.wishes);
        TellWhatHasNoEffect(findings, order.wishes, request);
        WarnOfContent(findings, order, request);
        WarnOfRoom(findings, order, request, folder);
    } catch (const PresetError& error) {
        findings.warnings += SentenceOf(error.Words());
    }
    return findings;
}

} // namespace movieconv::window
