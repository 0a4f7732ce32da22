// Why a source cannot be used.
#ifndef MOVIECONV_HOST_SOURCE_SOURCEERROR_H
#define MOVIECONV_HOST_SOURCE_SOURCEERROR_H

#include "host/sentence/SentenceError.h"

namespace movieconv {

/// The source cannot be opened or holds nothing that can be converted. The text names the file and the
/// reason.
class SourceError : public SentenceError {
public:
    using SentenceError::SentenceError;
};

/// The source names other files, and nobody has allowed them to be read.
class PlaylistError : public SourceError {
public:
    using SourceError::SourceError;
};

/// There is no stream such as is asked for. The text says which there are.
class TrackError : public SourceError {
public:
    using SourceError::SourceError;
};

/// What is to be cut off its pictures leaves too little of them.
class CropError : public SourceError {
public:
    using SourceError::SourceError;
};

/// There is no folder that temporary files can be written into.
class ScratchError : public SourceError {
public:
    using SourceError::SourceError;
};

} // namespace movieconv

#endif
