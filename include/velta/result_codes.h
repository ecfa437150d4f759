#pragma once

#include <cstdint>

namespace orx::cs::velta {

/// What an ingestion operation answers: 0 is success. Codes that the sibling library or the
/// loader of libraries answers are passed on unchanged and are not among those below.
using ResultCode = std::int32_t;

/// A result code and what it says to a person.
struct ResultMeaning {
  ResultCode code;
  const char* meaning;
};

inline constexpr ResultCode kSuccess = 0;
inline constexpr ResultCode kNotTheCurrentDescription = 1;
inline constexpr ResultCode kValueRefused = static_cast<ResultCode>(0x80040401);
inline constexpr ResultCode kDatumFileTrouble = static_cast<ResultCode>(0x80040632);
inline constexpr ResultCode kMissing1023 = static_cast<ResultCode>(0x80040633);
inline constexpr ResultCode kEntryNotWritten = static_cast<ResultCode>(0x80040634);
inline constexpr ResultCode kBadComputationIndicator = static_cast<ResultCode>(0x80040635);
inline constexpr ResultCode kNoDirectory = static_cast<ResultCode>(0x80040636);
inline constexpr ResultCode kUnsupportedProjection = static_cast<ResultCode>(0x80040638);
inline constexpr ResultCode kMissingProjectionPart = static_cast<ResultCode>(0x80040639);
inline constexpr ResultCode kProjectionFileTrouble = static_cast<ResultCode>(0x80040640);
inline constexpr ResultCode kNoDatumMessage = static_cast<ResultCode>(0x80040642);
inline constexpr ResultCode kNoDatumName = static_cast<ResultCode>(0x80040643);
inline constexpr ResultCode kNoSiblingLibrary = static_cast<ResultCode>(0x80040644);

/// Every result code of this library with its meaning.
inline constexpr ResultMeaning kResultMeanings[] = {
    {kSuccess, "done, or the entry was already there"},
    {kNotTheCurrentDescription, "not the object's current datum or projection, nothing written"},
    {kValueRefused, "stored value of another type or size"},
    {kDatumFileTrouble, "datum file damaged, missing, without its container key, or not saved"},
    {kMissing1023, "the 1023 that belongs to the datum message is missing"},
    {kEntryNotWritten, "the entry could not be written or the file not saved"},
    {kBadComputationIndicator, "unacceptable computation indicator"},
    {kNoDirectory, "the directory does not exist and cannot be made"},
    {kUnsupportedProjection, "projection type not supported"},
    {kMissingProjectionPart, "a 1024, 1025 or 1027 that the message set requires is missing"},
    {kProjectionFileTrouble,
     "projection file damaged, missing, without its container key, or not saved"},
    {kNoDatumMessage, "the message set has neither a 1021 nor a 1022"},
    {kNoDatumName, "no target datum name"},
    {kNoSiblingLibrary, "the library RTCMGridHost cannot be loaded or lacks an entry point"},
};

}  // namespace orx::cs::velta
