#include "velta/rtcm_data_support.h"

#include "store/shared_file.h"
#include "userdirs/user_dirs.h"

namespace orx::cs::velta {
namespace {

constexpr const wchar_t* kDatumFolder = L"/datums/rtcmdata/";
constexpr const wchar_t* kProjectionFolder = L"/projections/rtcmdata/";

constexpr const wchar_t* kRtcmGroup = L"RTCM";
constexpr const wchar_t* kMeters = L"Meters";

COrxStringT<wchar_t> GivenOr(const wchar_t* path, const wchar_t* folder) {
  return path ? COrxStringT<wchar_t>(path) : GetUserGeoDir() + folder;
}

}  // namespace

TDLLFuncWrapper RTCMDataSupport::DLLdatum;
TDLLFuncWrapper RTCMDataSupport::DLLprojection;
TCSInFileKey* RTCMDataSupport::GFFDatumFile = nullptr;
TCSInFileKey* RTCMDataSupport::GFFProjectionFile = nullptr;

RTCMDataSupport::RTCMDataSupport(const wchar_t* datumDirectory, const wchar_t* projectionDirectory)
    : datumPath(GivenOr(datumDirectory, kDatumFolder)),
      projectionPath(GivenOr(projectionDirectory, kProjectionFolder)) {
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
