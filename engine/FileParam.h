// Encoding parameters for a file of a certain name.
#ifndef MOVIECONV_ENGINE_FILEPARAM_H
#define MOVIECONV_ENGINE_FILEPARAM_H

#include "media/EncodeParam.h"

/// Fills `param` by the extension of `fileName` and the media writer's table. False, with `param` untouched,
/// when no format has that extension, and for null.
bool ParamForFile(const wchar_t* fileName, EncodeParam* param);

#endif
