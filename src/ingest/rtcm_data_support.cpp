#include "velta/rtcm_data_support.h"

#include "ingest/shared_file.h"
#include "userdirs/user_dirs.h"
#include "velta/file_names.h"

namespace orx::cs::velta {
namespace {

constexpr const wchar_t* kRtcmGroup = L"RTCM";
constexpr const wchar_t* kMeters = L"Meters";

/// \param given null for the folder of the user's geodetic directory
COrxStringT<wchar_t> DirectoryOf(const wchar_t* given, const wchar_t* folder) {
  return given ? COrxStringT<wchar_t>(given) : GetUserGeoDir() + folder;
}

}  // namespace

TDLLFuncWrapper RTCMDataSupport::DLLdatum;
TDLLFuncWrapper RTCMDataSupport::DLLprojection;
TCSInFileKey* RTCMDataSupport::GFFDatumFile = nullptr;
TCSInFileKey* RTCMDataSupport::GFFProjectionFile = nullptr;

RTCMDataSupport::RTCMDataSupport(const wchar_t* datumDirectory, const wchar_t* projectionDirectory)
    : datumPath(DirectoryOf(datumDirectory, kDatumFolder)),
      projectionPath(DirectoryOf(projectionDirectory, kProjectionFolder)) {
  // Without the sibling library now, the first message tries again and reports it.
  GetDatumTransformationDLL();
  GetPrjTransformationDLL();
}

RTCMDataSupport::~RTCMDataSupport() {
  UnloadSibling(kDatumFiles);
  UnloadSibling(kProjectionFiles);
}

RTCMDataSupport& RTCMDataSupport::operator=(const RTCMDataSupport& other) = default;

ResultCode RTCMDataSupport::GetDatumTransformationDLL() { return LoadSibling(kDatumFiles); }

ResultCode RTCMDataSupport::GetPrjTransformationDLL() { return LoadSibling(kProjectionFiles); }

ResultCode RTCMDataSupport::GetUnlockedPtrDatumGFF(const COrxStringT<wchar_t>& fileName,
                                                   TCSInFileKey** file) {
  return Obtain(kDatumFiles, fileName, file);
}

void RTCMDataSupport::ReleasePtrDatumGFF(const COrxStringT<wchar_t>& fileName) {
  GiveBack(kDatumFiles, fileName);
}

ResultCode RTCMDataSupport::GetUnlockedPtrProjectionGFF(const COrxStringT<wchar_t>& fileName,
                                                        TCSInFileKey** file) {
  return Obtain(kProjectionFiles, fileName, file);
}

void RTCMDataSupport::ReleasePtrProjectionGFF(const COrxStringT<wchar_t>& fileName) {
  GiveBack(kProjectionFiles, fileName);
}

COrxStringT<wchar_t> RTCMDataSupport::GetDatumPath() const { return datumPath; }

COrxStringT<wchar_t> RTCMDataSupport::GetProjectionPath() const { return projectionPath; }

COrxStringT<wchar_t> RTCMDataSupport::GetRegionName() { return regionName; }

COrxStringT<wchar_t> RTCMDataSupport::GetSourceDatumName() const { return datum.sourceDatumName; }

COrxStringT<wchar_t> RTCMDataSupport::GetTargetDatumName() const { return datum.targetDatumName; }

projmath::Ellipsoid& RTCMDataSupport::GetDatumSourceEllipsoid() { return datum.sourceEllipsoid; }

projmath::Ellipsoid& RTCMDataSupport::GetDatumTargetEllipsoid() { return datum.targetEllipsoid; }

void RTCMDataSupport::SetDatumEllipsoidName(const COrxStringT<wchar_t>& name) {
  datum.ellipsoidName = name;
}

bool RTCMDataSupport::GetCustomDatumData(CustomDatumData& summary) {
  summary.ellipsoidName = datum.ellipsoidName;
  summary.datumName = datum.targetDatumName;
  summary.datumGroup = kRtcmGroup;
  summary.transformationDll = kSiblingLibrary;
  return !summary.ellipsoidName.empty();
}

bool RTCMDataSupport::GetCustomProjectionData(CustomProjectionData& summary) {
  summary.projectionName = projection.rtcmProjName;
  summary.projectionGroup = kRtcmGroup;
  summary.transformationDll = kSiblingLibrary;
  summary.datumName = projection.datumName;
  summary.projectionType = projection.prjType;
  summary.unitName = kMeters;
  return !summary.datumName.empty() && !summary.transformationDll.empty() &&
         !summary.projectionName.empty();
}

}  // namespace orx::cs::velta
