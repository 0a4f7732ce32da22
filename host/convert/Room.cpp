#include "host/convert/Room.h"

#include "host/convert/Amounts.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Engine.h"
#include "host/convert/Failure.h"
#include "host/convert/SizePlan.h"
#include "host/convert/Sources.h"
#include "host/sentence/Say.h"
#include "text/Path.h"

#include <sys/statvfs.h>

namespace movieconv {

int64_t FreeBytes(const std::string& folder) {
    struct statvfs status {};
    if (statvfs(folder.c_str(), &status) != 0 || status.f_blocks == 0)
        return -1;
    return static_cast<int64_t>(status.f_bavail) * static_cast<int64_t>(status.f_frsize);
}

Warning WaitsForRoom(const std::string& output, int64_t bytes) {
    return {Warning::Kind::kWaitsForRoom,
            Say("no space is left for \"{}\"; waiting until there is room for {}", output,
                SayAmount(FormatBytes(bytes)))};
}

Room EstimateRoom(const Request& request) {
    ChooseFormat(request);
    Movie movie = OpenMovie(request);
    if (movie.Info().certainty == Certainty::kGuessed && !request.length) {
        throw Failure(Category::kRequest, Say("\"{}\" does not tell how long it is", request.input),
                      Reason::kUnknownLength);
    }
    const double length = LengthToConvert(request, movie.Info());
    const Request fitted = FitIntoSize(request, movie.Info());
    const Engine engine = MakeEngine(fitted, movie.Info(), movie.Pictures(), movie.Sound());
    EncodeParam param{};
    MCGetEncodeParam(engine.get(), &param);
    const std::string folder = text::FolderOf(request.output);
    return {length, NeededBytes(param, fitted, movie.Info(), length).value_or(-1), folder, FreeBytes(folder)};
}

} // namespace movieconv
