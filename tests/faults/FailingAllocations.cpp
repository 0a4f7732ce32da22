// To be preloaded: the allocation whose number MOVIECONV_FAILING_ALLOCATION names, from 1, fails, with a "-"
// behind it all later ones too. They are counted from the start of main, which calls mallopt, to its end:
// behind that gcov needs some.
#include "tests/engine/CountingAllocator.h"
#include "tests/faults/CrashReport.h"

#include <cstdio>
#include <cstdlib>

namespace {

void Tell() {
    if (!FailAllocation(0))
        std::fputs("No allocation has failed.\n", stderr);
}

} // namespace

extern "C" __attribute__((visibility("default"))) int mallopt(int /*parameter*/, int /*value*/) noexcept {
    char* end = nullptr;
    const char* which = std::getenv("MOVIECONV_FAILING_ALLOCATION");
    const long number = which != nullptr ? std::strtol(which, &end, 10) : 0;
    ReportCrashes();
    std::atexit(Tell);
    if (number > 0)
        FailAllocation(number, *end == '-' ? Lack::kLasting : Lack::kOnce, TellPlace);
    return 1;
}
