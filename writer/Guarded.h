// What stands between the writer's C functions and its exceptions.
#ifndef MOVIECONV_WRITER_GUARDED_H
#define MOVIECONV_WRITER_GUARDED_H

namespace writer {

/// The result of `call`; `otherwise` when it throws.
template <typename Result, typename Call>
Result Guarded(Result otherwise, Call call) noexcept {
    try {
        return call();
    } catch (...) {
        return otherwise;
    }
}

} // namespace writer

#endif
