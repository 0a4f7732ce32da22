// Splitting the output into clips, and their names.
#include "engine/ConvThread.h"
#include "log/dyLog.h"
#include "text/FileNames.h"
#include "thread/SingleLock.h"

#include <algorithm>
#include <cwchar>
#include <exception>

namespace {

/// False when the file name, its extension or the clip name is too long: a cut name would be another clip's.
bool FormatClipName(wchar_t* name, const std::wstring& file, size_t number) {
    const std::wstring_view whole(file);
    if (file.size() >= kClipNameSize || text::SplitName(whole).second.size() > text::kLongestClipExtension)
        return false;
    const std::wstring clip = text::ClipName(whole, number);
    if (clip.size() >= kClipNameSize)
        return false;
    std::wcscpy(name, clip.c_str());
    return true;
}

} // namespace

int ConvThread::SetSplitParam(int mode, unsigned long value) {
    if (IsActive())
        return 0;
    nSplitMode = mode;
    nSplitValue = static_cast<uint32_t>(std::min<unsigned long>(value, UINT32_MAX));
    return 1;
}

wchar_t* ConvThread::CreateNewClip() {
    try {
        auto name = std::make_unique<wchar_t[]>(kClipNameSize);
        if (!FormatClipName(name.get(), strOutputFile, vecTargetNames.size())) {
            LogAt(kLogError, L"MovieConv::CreateNewClip(): output name too long for clips.\r\n");
            results.Fail(MC_RESULT_PARAMETERS, "The output's name is too long for the names of clips.");
            return nullptr;
        }
        const CSingleLock guard(&sharedLock);
        return vecTargetNames.emplace_back(std::move(name)).get();
    } catch (const std::exception&) {
        LogAt(kLogError, L"MovieConv::CreateNewClip(): no memory for a clip name.\r\n");
        results.Fail(MC_RESULT_INTERNAL, "There was no memory for the name of a clip.");
        return nullptr;
    }
}

int ConvThread::GetTargetCount() const {
    const CSingleLock guard(&sharedLock);
    return static_cast<int>(vecTargetNames.size());
}

int ConvThread::GetTargetFileName(wchar_t* buffer, int index) const {
    const CSingleLock guard(&sharedLock);
    if (!buffer || index < 0 || static_cast<size_t>(index) >= vecTargetNames.size())
        return 0;
    std::wcscpy(buffer, vecTargetNames[static_cast<size_t>(index)].get());
    return 1;
}
