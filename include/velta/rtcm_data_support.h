#pragma once

#include <cstdint>

#include "orxutils/dll_func_loader.h"
#include "orxutils/orx_string.h"
#include "velta/datum_data.h"
#include "velta/export.h"
#include "velta/projection_data.h"
#include "velta/result_codes.h"
#include "velta/rtcm_messages.h"

namespace orx {
class TCSInFileKey;
class TGenericRegistryKey;
}  // namespace orx

/// The library: message records to entries of datum and projection files, and back.
namespace orx::cs::velta {

/// Turns received transformation messages into entries of the shared RTCM datum and projection
/// files. A projection belongs to the datum that the same object ingested before it.
///
/// What a set does not bring stays as the object has it: a datum without a 1023 keeps the residual
/// grid of the object's last datum, a 1021 the rotation point of its last 1022, and both are
/// written into the entry. Who wants neither assigns an object that has never ingested (`support =
/// fresh`) before each set.
///
/// Construction, destruction and ingestion must not run in two threads at the same time, nor a
/// merge beside construction or destruction; the shared files themselves are guarded by their own
/// mutexes.
class RTCMDataSupport {
 public:
  /// Loads the sibling library if it can; makes no directory.
  /// \param datumDirectory directory of the datum files, ending in a separator; taken as it is.
  ///     Null: the user's geodetic directory and "/datums/rtcmdata/".
  /// \param projectionDirectory the same for projection files; null: "/projections/rtcmdata/"
  /// \throws std::runtime_error when a directory is null and the user's has no name; the text names
  ///     the environment variable
  VELTA_EXPORT RTCMDataSupport(const wchar_t* datumDirectory = nullptr,
                               const wchar_t* projectionDirectory = nullptr);

  RTCMDataSupport(const RTCMDataSupport&) = delete;

  /// Unloads the sibling library for the whole process; the next operation that needs it loads
  /// it again.
  VELTA_EXPORT ~RTCMDataSupport();

  /// Copies everything but the datum's `ellipsoidName` and what the assignment of
  /// `ProjectionData` leaves out.
  VELTA_EXPORT RTCMDataSupport& operator=(const RTCMDataSupport& other);

  /// Loader of the sibling library for datum files; empty until first loaded.
  VELTA_EXPORT static TDLLFuncWrapper DLLdatum;
  /// Loader of the sibling library for projection files; empty until first loaded.
  VELTA_EXPORT static TDLLFuncWrapper DLLprojection;
  /// Shared datum file worked on last; owned by the sibling library. Points nowhere once that has
  /// been unloaded, which the end of any object does.
  VELTA_EXPORT static TCSInFileKey* GFFDatumFile;
  /// As GFFDatumFile, for the projection file worked on last.
  VELTA_EXPORT static TCSInFileKey* GFFProjectionFile;

  /// Loads the sibling library for datum files if it is not loaded.
  /// \return 0, kNoSiblingLibrary, or the loader's status
  VELTA_EXPORT static ResultCode GetDatumTransformationDLL();
  /// Loads the sibling library for projection files if it is not loaded.
  /// \return 0, kNoSiblingLibrary, or the loader's status
  VELTA_EXPORT static ResultCode GetPrjTransformationDLL();

  /// Obtains the shared tree of a datum file. The tree's mutex is not held on return: lock
  /// `(*file)->GetMutex()` before touching the tree, and give the file back when done, also after a
  /// code other than 0.
  /// \param fileName full path including ".dff"
  /// \param file receives the tree, which stays the sibling library's
  /// \return 0, kNoSiblingLibrary, the loader's status, or the sibling library's code
  VELTA_EXPORT static ResultCode GetUnlockedPtrDatumGFF(const COrxStringT<wchar_t>& fileName,
                                                        TCSInFileKey** file);
  /// Gives a datum file back to the sibling library. Never fails.
  VELTA_EXPORT static void ReleasePtrDatumGFF(const COrxStringT<wchar_t>& fileName);

  /// As GetUnlockedPtrDatumGFF, for a projection file (".prj").
  VELTA_EXPORT static ResultCode GetUnlockedPtrProjectionGFF(const COrxStringT<wchar_t>& fileName,
                                                             TCSInFileKey** file);
  /// Gives a projection file back to the sibling library. Never fails.
  VELTA_EXPORT static void ReleasePtrProjectionGFF(const COrxStringT<wchar_t>& fileName);

  /// Directory of the datum files, as given to the constructor.
  VELTA_EXPORT COrxStringT<wchar_t> GetDatumPath() const;
  /// Directory of the projection files, as given to the constructor.
  VELTA_EXPORT COrxStringT<wchar_t> GetProjectionPath() const;
  /// Region of the last datum message's tectonic plate; empty before the first.
  VELTA_EXPORT COrxStringT<wchar_t> GetRegionName();
  /// The current datum's source system; empty before the first.
  VELTA_EXPORT COrxStringT<wchar_t> GetSourceDatumName() const;
  /// The current datum's name, also the base name of its file; empty before the first.
  VELTA_EXPORT COrxStringT<wchar_t> GetTargetDatumName() const;
  /// The current datum's source ellipsoid; the reference lives as long as the object.
  VELTA_EXPORT projmath::Ellipsoid& GetDatumSourceEllipsoid();
  /// The current datum's target ellipsoid; the reference lives as long as the object.
  VELTA_EXPORT projmath::Ellipsoid& GetDatumTargetEllipsoid();
  /// Names the current datum's ellipsoid as the caller's catalogue does. The name stays until the
  /// next call, also across datums.
  VELTA_EXPORT void SetDatumEllipsoidName(const COrxStringT<wchar_t>& name);
  /// Fills the summary of the current datum.
  /// \return true when the datum's ellipsoid has been named; the summary is filled either way
  VELTA_EXPORT bool GetCustomDatumData(CustomDatumData& summary);
  /// Fills the summary of the current projection.
  /// \return true when a projection has been parsed; the summary is filled either way
  VELTA_EXPORT bool GetCustomProjectionData(CustomProjectionData& summary);

  /// Ingests a message set: its datum message, then the projection that its flags ask for. The
  /// set's pointers and flags are kept; the records are only read during the call. When one of the
  /// projection messages that the flags ask for is missing, neither is taken.
  /// \return 0, kNoDatumMessage, kMissing1023, kNoDatumName, kMissingProjectionPart, or a code of
  ///     ParseDatumMessages or ParseProjectionMessages
  VELTA_EXPORT ResultCode ParseRTCMMEssages(MsgUtilized& messages);

  /// Tells which further messages belong to a datum message. Forgets the set that the object
  /// holds.
  /// \return the flags; the reference lives as long as the object, the next call of this or of
  ///     ParseRTCMMEssages overwrites what it refers to
  VELTA_EXPORT UtilizedMsgInfo& GetUtilizedMessageInfo(RtcmBasicTransformMessage& message);

  /// Makes a 1021 the current datum and adds it to the datum file of its target datum.
  /// \param message the 1021
  /// \param grid the 1023 that belongs to it, or null
  /// \return 0 (also when the entry was there), kMissing1023, kBadComputationIndicator,
  ///     kNoDirectory, kDatumFileTrouble, kEntryNotWritten, kNoSiblingLibrary, the loader's status,
  ///     or the sibling library's code
  VELTA_EXPORT ResultCode ParseDatumMessages(const Rtcm1021& message, const Rtcm1023* grid);
  /// As for a 1021, with the rotation point of a 1022.
  VELTA_EXPORT ResultCode ParseDatumMessages(const Rtcm1022& message, const Rtcm1023* grid);

  /// Adds the object's current datum to the shared datum file `GFFDatumFile`, unless an entry of
  /// its name is there, and saves the file. The caller holds the file's mutex.
  /// \return 0, kNotTheCurrentDescription, kDatumFileTrouble or kEntryNotWritten
  VELTA_EXPORT ResultCode AddDatumToGFF(DatumData& description);

  /// Makes a 1025 the current projection and adds it to the projection file of the current datum.
  /// \param message the 1025
  /// \param grid the 1024 that belongs to it, or null
  /// \return 0 (also when the entry was there), kNoDatumName, kUnsupportedProjection,
  ///     kNoDirectory, kProjectionFileTrouble, kEntryNotWritten, kNoSiblingLibrary, the loader's
  ///     status, or the sibling library's code
  VELTA_EXPORT ResultCode ParseProjectionMessages(const Rtcm1025& message, const Rtcm1024* grid);
  /// Refuses: changes nothing and returns kUnsupportedProjection.
  VELTA_EXPORT ResultCode ParseProjectionMessages(const Rtcm1026& message, const Rtcm1024* grid);
  /// As for a 1025, for the oblique Mercator, rectified or not.
  VELTA_EXPORT ResultCode ParseProjectionMessages(const Rtcm1027& message, const Rtcm1024* grid);

  /// Adds the object's current projection to the shared projection file `GFFProjectionFile`,
  /// unless an entry of its name is there, and saves the file. The caller holds the file's mutex.
  /// \return 0, kNotTheCurrentDescription, kProjectionFileTrouble or kEntryNotWritten
  VELTA_EXPORT ResultCode AddProjectionToGFF(ProjectionData& description);

  /// Copies every entry of the datum file `source` into the shared datum file `target` and saves
  /// it. An entry that both hold gets the source's values; nothing is deleted. Holds the target's
  /// mutex meanwhile, and gives the target back whatever the outcome. While an object is there,
  /// other threads may ingest and merge meanwhile, but neither make nor end one.
  /// \return 0, kDatumFileTrouble, kNoSiblingLibrary, the loader's status, or the sibling library's
  ///     code
  VELTA_EXPORT static ResultCode MergeRTCMDatumfiles(const COrxStringT<wchar_t>& target,
                                                     const COrxStringT<wchar_t>& source);
  /// As MergeRTCMDatumfiles, for projection files, with kProjectionFileTrouble.
  VELTA_EXPORT static ResultCode MergeRTCMProjectionfiles(const COrxStringT<wchar_t>& target,
                                                          const COrxStringT<wchar_t>& source);

 private:
  /// \param rotationPoint the message again when it is a 1022, null when it is a 1021
  ResultCode ParseDatum(const RtcmBasicTransformMessage& message, const Rtcm1022* rotationPoint,
                        const Rtcm1023* grid);
  /// \param typeCode the projection's type code, 100 for the rectified oblique Mercator
  template <class Message>
  ResultCode ParseProjection(const Message& message, std::uint32_t typeCode, const Rtcm1024* grid);

  COrxStringT<wchar_t> SetRegionNameByPlateNumber(std::uint32_t plateNumber);

  ResultCode InitDatumGFF(DatumData& description);
  ResultCode CreateNewDatumGFF(const COrxStringT<wchar_t>& path, DatumData& description);
  ResultCode InitWithExistedDatumGFF(const COrxStringT<wchar_t>& path);
  ResultCode InitDatumRegKey(TGenericRegistryKey& entry, DatumData& description);

  ResultCode InitProjectionGFF(ProjectionData& description);
  ResultCode CreateNewPrjGFF(const COrxStringT<wchar_t>& path, ProjectionData& description);
  ResultCode InitWithExistedPrjGFF(const COrxStringT<wchar_t>& path);
  ResultCode InitPrjRegKey(TGenericRegistryKey& entry, ProjectionData& description);

  static ResultCode _MergeRTCMDatumfiles(const COrxStringT<wchar_t>& target,
                                         const COrxStringT<wchar_t>& source);
  static ResultCode MergeRTCMDatumfiles(TGenericRegistryKey& target, TGenericRegistryKey& source);
  static ResultCode _MergeRTCMProjectionfiles(const COrxStringT<wchar_t>& target,
                                              const COrxStringT<wchar_t>& source);
  static ResultCode MergeRTCMProjectionfiles(TGenericRegistryKey& target,
                                             TGenericRegistryKey& source);

  COrxStringT<wchar_t> datumPath;
  COrxStringT<wchar_t> projectionPath;
  DatumData datum;
  ProjectionData projection;
  MsgUtilized msgUtilized;
  COrxStringT<wchar_t> datumEntryName;
  COrxStringT<wchar_t> projectionEntryName;
  COrxStringT<wchar_t> regionName;
};

}  // namespace orx::cs::velta
