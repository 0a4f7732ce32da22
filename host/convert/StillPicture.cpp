#include "host/convert/StillPicture.h"

#include "host/convert/PictureTap.h"
#include "host/convert/Sources.h"
#include "host/source/LogSilence.h"

#include <chrono>

namespace movieconv {

std::shared_ptr<const ShownPicture> PictureAt(const std::string& path, double seconds) {
    const LogSilence silence; // or they would stand among what a conversion says
    Request request;
    request.input = path;
    request.noAudio = true;
    Movie movie = OpenMovie(request);
    if (movie.Pictures() == nullptr)
        return nullptr;
    movie.Pictures()->Seek(seconds, 1);
    const VideoImage* image = movie.Pictures()->GetCurrentImage();
    PictureTap tap(std::chrono::milliseconds(0));
    tap.Expect(*movie.Info().pictures, movie.KeepsHdr());
    if (image != nullptr)
        tap.OfferLast(*image);
    movie.Stop();
    return tap.Take();
}

} // namespace movieconv
