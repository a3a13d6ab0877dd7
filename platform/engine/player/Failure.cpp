// SPDX-License-Identifier: MIT
#include "player/Failure.h"

#include "LibMediaPlayer/Result.h"

namespace engine {

using namespace LibMediaPlayer;

namespace {

struct ResultText {
    int result;
    const wchar_t* text;
};

constexpr ResultText kTexts[] = {
    {kNotFound, L"The file does not exist."},
    {kAccessDenied, L"The file may not be read."},
    {kNotMedia, L"This is not a medium that can be played."},
    {kDamaged, L"The file is damaged or incomplete."},
    {kNotAvailable, L"The medium is not available."},
    {kCancelled, L"Cancelled."},
    {kTimedOut, L"The medium did not open in time."},
    {kNoSpace, L"There is no space left."},
};

int resourceResult(int code) {
    switch (code) {
    case GST_RESOURCE_ERROR_NOT_FOUND:
        return kNotFound;
    case GST_RESOURCE_ERROR_OPEN_READ:
    case GST_RESOURCE_ERROR_NOT_AUTHORIZED:
        return kAccessDenied;
    case GST_RESOURCE_ERROR_NO_SPACE_LEFT:
        return kNoSpace;
    default:
        return kNotAvailable;
    }
}

int streamResult(int code) {
    switch (code) {
    case GST_STREAM_ERROR_TYPE_NOT_FOUND:
    case GST_STREAM_ERROR_WRONG_TYPE:
    case GST_STREAM_ERROR_CODEC_NOT_FOUND:
    case GST_STREAM_ERROR_DECRYPT:
    case GST_STREAM_ERROR_DECRYPT_NOKEY:
        return kNotMedia;
    default:
        return kDamaged;
    }
}

int resultOf(const GError& error) {
    if (error.domain == GST_RESOURCE_ERROR)
        return resourceResult(error.code);
    if (error.domain == GST_STREAM_ERROR)
        return streamResult(error.code);
    if (error.domain == GST_CORE_ERROR && error.code == GST_CORE_ERROR_MISSING_PLUGIN)
        return kNotMedia;
    return kInternal;
}

} // namespace

Failure failure(int result) {
    for (const ResultText& entry : kTexts) {
        if (entry.result == result)
            return {result, entry.text};
    }
    return {result, L"The media engine failed."};
}

Failure failureOf(GstMessage* error) {
    gst::Error details;
    gst_message_parse_error(error, details.out(), nullptr);
    return failure(details ? resultOf(*details.get()) : kInternal);
}

} // namespace engine
