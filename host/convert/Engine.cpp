#include "host/convert/Engine.h"

#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/sentence/Say.h"
#include "text/Utf8.h"

namespace movieconv {
Engine MakeEngine(const Request& request, const SourceInfo& source, VideoDecoder* pictures,
                  AudioDecoder* sound, uint32_t writerSet) {
    const FileFormatInfo& format = ChooseFormat(request);
    Engine engine(MCCreate(pictures, sound));
    EncodeParam defaults{};
    if (!engine || MCGetEncodeParam(engine.get(), &defaults) == 0)
        throw Failure(Category::kInternal, Say("no memory for the converter"));
    EncodeParam param = PlanEncoding(defaults, format, request, source);
    param.nReserved[kWriterSetWord] = writerSet;
    MCSetEncodeParam(engine.get(), &param);
    MCSetOutputFile(engine.get(), text::FromUtf8(request.output).c_str());
    if (request.split && param.bNoVideo != 0)
        throw Failure(Category::kRequest, Say("a split needs pictures: sound alone is written as one file"));
    MCEnableEvents(engine.get(), 0); // all that they tell comes by the callback, too
    return engine;
}

} // namespace movieconv
