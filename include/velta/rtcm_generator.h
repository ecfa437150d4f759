#pragma once

#include <boost/shared_ptr.hpp>
#include <cstdint>
#include <vector>

#include "orxutils/orx_dl_allocator.h"
#include "orxutils/orx_string.h"
#include "velta/datum_data.h"
#include "velta/export.h"
#include "velta/projection_data.h"
#include "velta/rtcm_messages.h"

namespace orx::cs::velta {

/// Builds message records from the entries of a datum file and a projection file.
///
/// Holds no open file: each query reads the file as it is at that moment and closes it. Nothing
/// is written and no lock is taken, so queries may run in many threads at once. A query that
/// finds nothing, or a file that it cannot use, answers with an empty result. Conversions to
/// message integers truncate toward zero.
class VELTA_EXPORT RTCMGenerator {
 public:
  /// \param id System Identification Number of every record built
  /// \param datumFileName full path of the datum file; it need not exist
  /// \param projFileName full path of the projection file; it need not exist
  RTCMGenerator(std::int32_t id, const COrxStringT<wchar_t>& datumFileName,
                const COrxStringT<wchar_t>& projFileName);
  /// A copy takes over the number and the two names.
  RTCMGenerator(const RTCMGenerator& other);
  /// Takes over the number and the two names.
  RTCMGenerator& operator=(const RTCMGenerator& other);
  virtual ~RTCMGenerator();

  /// The record of the first datum entry whose area of validity holds the position.
  /// \param latitude radians
  /// \param longitude radians
  /// \param height not used
  /// \return an RtcmBasicTransformMessage with `messageType` 21, an Rtcm1022 with `messageType`
  ///     22, or an empty pointer; a malformed entry in front of the one looked for ends the search
  virtual boost::shared_ptr<RtcmBasicTransformMessage> getRtcmDatumMessage(double latitude,
                                                                           double longitude,
                                                                           double height) const;

  /// The residual grid of the first datum entry whose grid covers the position.
  /// \param latitude radians
  /// \param longitude radians
  /// \param height not used
  /// \return the record, or an empty pointer; a malformed entry in front ends the search
  virtual boost::shared_ptr<Rtcm1023> get1023(double latitude, double longitude,
                                              double height) const;

  /// The plane residual grid of the first projection entry whose grid covers the position.
  /// \param northing metres
  /// \param easting metres
  /// \param height not used
  /// \return the record, or an empty pointer; a malformed entry in front ends the search
  virtual boost::shared_ptr<Rtcm1024> get1024(double northing, double easting, double height) const;

  /// The first projection entry's message.
  /// \return an Rtcm1025 (`messageType` 25), an Rtcm1027 (27), or an empty pointer
  virtual boost::shared_ptr<RtcmMessage> getRtcmProjMessage() const;

  /// Every complete datum entry of the datum file, in the file's order; incomplete ones are left
  /// out. The grid's centre and `hasTable` are not filled; `validityCentre` is the centre of
  /// `validityArea`.
  std::vector<DatumData, orx_dl_allocator<DatumData>> getAllDatums() const;

  /// The projection type of a stored type string, ignoring case; NONE for an unknown one.
  static ProjectionData::projList getRtcmPrjTypeFromString(const COrxStringT<wchar_t>& type);

  /// The datum file that queries read.
  COrxStringT<wchar_t> datumFileName() const;
  /// The projection file that queries read.
  COrxStringT<wchar_t> projFileName() const;
  /// Names the datum file that the next query reads.
  void setDatumFileName(const COrxStringT<wchar_t>& name);
  /// Names the projection file that the next query reads.
  void setProjFileName(const COrxStringT<wchar_t>& name);

 private:
  std::int32_t systemId_;
  COrxStringT<wchar_t> datumFile_;
  COrxStringT<wchar_t> projFile_;
};

}  // namespace orx::cs::velta
