#include "host/source/LogSilence.h"

namespace movieconv {

thread_local bool LogSilence::holds_ = false;

} // namespace movieconv
