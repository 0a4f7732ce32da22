# The public headers as they are installed: in one folder, <movieconv/NAME.h>, so that none collides with an
# application's own. In the source tree they lie in their modules' folders; the includes, and what comments say of
# other headers, are rewritten here.
set(public_headers
  Common/Image/ImageConvert.h
  api/LogCallback.h
  api/MovieConv.h
  api/Version.h
  engine/AudioHelpers.h
  engine/PostMessage.h
  engine/ProgressInfo.h
  engine/Result.h
  host/convert/Failure.h
  host/convert/Formats.h
  host/convert/Job.h
  host/convert/LogTap.h
  host/convert/Observer.h
  host/convert/Preferences.h
  host/convert/Request.h
  host/convert/Room.h
  host/convert/Work.h
  host/sentence/Sentence.h
  host/sentence/SentenceError.h
  host/source/Crop.h
  host/source/Deinterlace.h
  host/source/TrackWishes.h
  logsink/LogSink.h
  media/Decoders.h
  media/EncodeParam.h
  media/FourCC.h
  media/MediaRecords.h
  media/MediaWriter.h
  media/ProgressCallback.h
  media/Sources.h
  platform/Platform.h
  platform/Window.h
  thread/TimeData.h
  writer/WriterStatus.h)

set(public_header_dir ${PROJECT_BINARY_DIR}/include/movieconv)
foreach(header IN LISTS public_headers)
  file(READ ${PROJECT_SOURCE_DIR}/${header} text)
  set(module "(Common/Image|api|engine|host/convert|host/sentence|host/source|logsink|media|platform|thread|writer)")
  string(REGEX REPLACE "#include \"${module}/([A-Za-z]+\\.h)\"" "#include <movieconv/\\2>" text "${text}")
  string(REGEX REPLACE "([^A-Za-z/])${module}/([A-Za-z]+\\.h)" "\\1<movieconv/\\3>" text "${text}")
  string(REGEX MATCHALL "#include \"[^\"]+\"" left "${text}")
  string(REGEX MATCHALL "#include <movieconv/[A-Za-z]+\\.h>" own "${text}")
  foreach(include IN LISTS own)
    string(REGEX REPLACE ".*/(.*)>" "\\1" include "${include}")
    if(NOT public_headers MATCHES "/${include}(;|$)")
      list(APPEND left ${include})
    endif()
  endforeach()
  if(left)
    message(FATAL_ERROR "${header} includes what is not installed with it: ${left}")
  endif()
  cmake_path(GET header FILENAME name)
  file(CONFIGURE OUTPUT ${public_header_dir}/${name} CONTENT "${text}" @ONLY)
  set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${header})
endforeach()
