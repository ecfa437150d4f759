#pragma once

#include <cstdint>

namespace orx::cs::velta {

/// What an ingestion operation answers: 0 is success. Codes that the sibling library or the
/// loader of libraries answers are passed on unchanged; those of RTCMGridHost and of the loader
/// here are the last two below.
using ResultCode = std::int32_t;

/// A result code and what it says to a person.
struct ResultMeaning {
  ResultCode code;      ///< as an operation answers it
  const char* meaning;  ///< in English; static text
};

/// Done, or the entry was already there.
inline constexpr ResultCode kSuccess = 0;
/// The description is not the object's current one; nothing is written.
inline constexpr ResultCode kNotTheCurrentDescription = 1;
/// A stored value is of another type or size than the adaptor that reads it.
inline constexpr ResultCode kValueRefused = static_cast<ResultCode>(0x80040401);
/// The datum file is damaged, missing, without its container key, or not saved.
inline constexpr ResultCode kDatumFileTrouble = static_cast<ResultCode>(0x80040632);
/// The datum message announces a 1023, and there is none.
inline constexpr ResultCode kMissing1023 = static_cast<ResultCode>(0x80040633);
/// The entry could not be written or the file not saved.
inline constexpr ResultCode kEntryNotWritten = static_cast<ResultCode>(0x80040634);
/// The computation indicator is above 3, or not 3 in a 1022.
inline constexpr ResultCode kBadComputationIndicator = static_cast<ResultCode>(0x80040635);
/// The directory of the files does not exist and cannot be made.
inline constexpr ResultCode kNoDirectory = static_cast<ResultCode>(0x80040636);
/// The projection type is not supported.
inline constexpr ResultCode kUnsupportedProjection = static_cast<ResultCode>(0x80040638);
/// The set requires a 1024, 1025 or 1027, and there is none.
inline constexpr ResultCode kMissingProjectionPart = static_cast<ResultCode>(0x80040639);
/// The projection file is damaged, missing, without its container key, or not saved.
inline constexpr ResultCode kProjectionFileTrouble = static_cast<ResultCode>(0x80040640);
/// The set has neither a 1021 nor a 1022.
inline constexpr ResultCode kNoDatumMessage = static_cast<ResultCode>(0x80040642);
/// There is no target datum name.
inline constexpr ResultCode kNoDatumName = static_cast<ResultCode>(0x80040643);
/// RTCMGridHost cannot be loaded or lacks an entry point.
inline constexpr ResultCode kNoSiblingLibrary = static_cast<ResultCode>(0x80040644);
/// RTCMGridHost: the shared file does not exist, or could not be made or opened.
inline constexpr ResultCode kNoSharedFile = static_cast<ResultCode>(0x80070002);
/// The loader: RTCMGridHost was found and the system cannot load it.
inline constexpr ResultCode kSiblingNotLoadable = static_cast<ResultCode>(0x8007000B);

/// Every result code above with its meaning.
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
    {kNoSharedFile, "the file does not exist, or could not be made or opened"},
    {kSiblingNotLoadable, "RTCMGridHost is no library that this system can load"},
};

}  // namespace orx::cs::velta
