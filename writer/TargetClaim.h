// One file of the process at a time for a name: of two that are written under the same one, the later to be
// finished would replace the other.
#ifndef MOVIECONV_WRITER_TARGETCLAIM_H
#define MOVIECONV_WRITER_TARGETCLAIM_H

#include <string>

namespace writer {

class TargetClaim {
public:
    /// Throws WriterFailure (kWriterErrorExists) when the name, in whatever way it is spelt, is taken.
    explicit TargetClaim(const std::string& target);
    ~TargetClaim();
    TargetClaim(const TargetClaim&) = delete;
    TargetClaim& operator=(const TargetClaim&) = delete;

private:
    std::string key_;
};

} // namespace writer

#endif
