#include "host/convert/Failure.h"
#include "host/terminal/ControlInput.h"
#include "host/terminal/MainLoop.h"
#include "host/terminal/Options.h"
#include "host/terminal/Session.h"
#include "host/terminal/SideFileCheck.h"
#include "host/terminal/StandardStreams.h"
#include "host/terminal/Tasks.h"
#include "text/Printable.h"

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <fcntl.h>
#include <malloc.h>
#include <new>
#include <optional>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr char kNoMemory[] = "movieconv: error: there is not enough memory\n";

/// A lack of memory also comes where no exception may pass, since destructors of libraries allocate. What is
/// being written stays as after a kill.
void TellLackOfMemoryWhereNothingMayThrow() {
    static const std::terminate_handler usual = std::get_terminate();
    std::set_terminate([] {
        try {
            if (const std::exception_ptr error = std::current_exception())
                std::rethrow_exception(error);
        } catch (const std::bad_alloc&) {
            if (write(STDERR_FILENO, kNoMemory, sizeof kNoMemory - 1) >= 0)
                _exit(static_cast<int>(ExitCode::kInternal));
        } catch (...) { // as usual
        }
        usual();
    });
}

void LimitHeap() {
    mallopt(M_ARENA_MAX, 1); // heaps of their own for the dozen threads cost 20 MB and save no time
}

/// The AV1 encoder writes to standard error by itself, and takes this as its only way to be told not to.
void SilenceEncoders() {
    constexpr int kUnlessSet = 0;
    setenv("SVT_LOG", "0", kUnlessSet);
}

/// Descriptors that the caller closed would be given to files and be written to as standard streams.
void OpenStandardDescriptors() {
    int descriptor = open("/dev/null", O_RDWR);
    while (descriptor >= 0 && descriptor <= STDERR_FILENO)
        descriptor = open("/dev/null", O_RDWR);
    close(descriptor);
}

int Main(int argc, char** argv) {
    const std::optional<Options> options = ParseOptions(argc, argv);
    if (!options)
        return static_cast<int>(ExitCode::kDone);
    CheckSideFiles(*options);
    MainLoop loop;
    ControlInput control(loop);
    const StandardStreams streams(options->log, options->request.overwrite);
    const std::optional<ExitCode> done = DoWithoutConverting(*options, streams);
    return static_cast<int>(done ? *done : Session(*options, streams, loop, control).Run());
}

void Tell(const Failure& failure) {
    try {
        std::fprintf(stderr, "movieconv: error: %s\n", text::Printable(Explain(failure)).c_str());
    } catch (const std::bad_alloc&) {
        std::fputs(kNoMemory, stderr);
    }
}

} // namespace
} // namespace movieconv

int main(int argc, char** argv) {
    movieconv::TellLackOfMemoryWhereNothingMayThrow();
    movieconv::LimitHeap();
    movieconv::SilenceEncoders();
    movieconv::OpenStandardDescriptors();
    try {
        return movieconv::Main(argc, argv);
    } catch (const movieconv::Failure& failure) {
        movieconv::Tell(failure);
        return static_cast<int>(movieconv::CodeOf(failure.Kind()));
    } catch (const std::bad_alloc&) {
        std::fputs(movieconv::kNoMemory, stderr);
        return static_cast<int>(movieconv::ExitCode::kInternal);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "movieconv: internal error: %s\n", error.what());
        return static_cast<int>(movieconv::ExitCode::kInternal);
    }
}
