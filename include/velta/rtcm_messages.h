#pragma once

#include <cstdint>

#include "orxutils/orx_string.h"

/// \file
/// Records of the RTCM SC-104 version 3 coordinate-transformation messages 1021 to 1027.
///
/// Every numeric field holds the integer as it travels in the message, in the unit that its
/// comment names: nothing is scaled, no constant is added, no range is checked.

namespace orx::cs::velta {

/// Number of points of a residual grid message: 4 rows of 4 columns.
inline constexpr int kResidualGridPoints = 16;

/// What every record has.
struct RtcmMessage {
  std::uint32_t messageType = 0;  ///< message number less 1000: 21 for a 1021
  std::uint32_t systemId = 0;     ///< System Identification Number

  RtcmMessage() = default;
  RtcmMessage(const RtcmMessage&) = default;
  RtcmMessage& operator=(const RtcmMessage&) = default;
  virtual ~RtcmMessage() = default;
};

/// What the two datum-transformation messages share.
struct RtcmBasicTransformMessage : RtcmMessage {
  std::int32_t phiV = 0;       ///< latitude of the centre of the area of validity, 2"
  std::int32_t lambdaV = 0;    ///< longitude of the centre of the area of validity, 2"
  std::uint32_t dPhiV = 0;     ///< extension of the area in latitude, 2"; 0 is every latitude
  std::uint32_t dLambdaV = 0;  ///< extension of the area in longitude, 2"; 0 is every longitude
  std::int32_t dX = 0;         ///< translation in X, 0.001 m
  std::int32_t dY = 0;         ///< translation in Y, 0.001 m
  std::int32_t dZ = 0;         ///< translation in Z, 0.001 m
  std::int32_t r1 = 0;         ///< rotation about X, 0.00002"
  std::int32_t r2 = 0;         ///< rotation about Y, 0.00002"
  std::int32_t r3 = 0;         ///< rotation about Z, 0.00002"
  std::int32_t dS = 0;         ///< scale correction, 0.00001 ppm
  std::uint32_t addAs = 0;     ///< source semi-major axis less 6 370 000 m, 0.001 m
  std::uint32_t addBs = 0;     ///< source semi-minor axis less 6 350 000 m, 0.001 m
  std::uint32_t addAt = 0;     ///< target semi-major axis less 6 370 000 m, 0.001 m
  std::uint32_t addBt = 0;     ///< target semi-minor axis less 6 350 000 m, 0.001 m
  /// Bit 0 announces a 1023, bit 1 a 1024, bit 2 a 1025, bit 3 a 1026, bit 4 a 1027.
  std::uint32_t utilizedMsgIndicator = 0;
  std::uint32_t plateNumber = 0;           ///< tectonic plate, 1 to 16
  std::uint32_t computationIndicator = 0;  ///< method: 0 to 3 in a 1021, 3 in a 1022
  std::uint32_t heightIndicator = 0;       ///< height indicator code
  std::uint32_t horQualityIndicator = 0;   ///< horizontal quality code
  std::uint32_t vertQualityIndicator = 0;  ///< vertical quality code
  std::uint32_t sourceNameCounter = 0;     ///< characters of `sourceName`; not read by ingestion
  COrxStringT<char> sourceName;            ///< source system, ISO 8859-1
  std::uint32_t targetNameCounter = 0;     ///< characters of `targetName`; not read by ingestion
  COrxStringT<char> targetName;            ///< target system, ISO 8859-1
};

/// Message 1021: Helmert or abridged Molodenski. Whoever fills it sets `messageType` to 21.
struct Rtcm1021 : RtcmBasicTransformMessage {};

/// Message 1022: Molodenski-Badekas. Whoever fills it sets `messageType` to 22.
struct Rtcm1022 : RtcmBasicTransformMessage {
  std::int64_t xp = 0;  ///< X of the rotation point, 0.001 m
  std::int64_t yp = 0;  ///< Y of the rotation point, 0.001 m
  std::int64_t zp = 0;  ///< Z of the rotation point, 0.001 m
};

/// What the two residual-grid messages share.
struct RtcmTableMessage : RtcmMessage {
  bool horShiftIndicator = false;              ///< horizontal shifts are present and apply
  bool vertShiftIndicator = false;             ///< vertical shifts are present and apply
  std::uint32_t horInterpolationMethod = 0;    ///< horizontal interpolation code
  std::uint32_t vertInterpolationMethod = 0;   ///< vertical interpolation code
  std::uint32_t horGridQualityIndicator = 0;   ///< horizontal grid quality code
  std::uint32_t vertGridQualityIndicator = 0;  ///< vertical grid quality code
  std::uint32_t mjd = 0;                       ///< Modified Julian Day number
};

/// Message 1023: residuals on an ellipsoidal grid of 4 by 4 points centred on its origin.
struct Rtcm1023 : RtcmTableMessage {
  std::int32_t phi0 = 0;                                  ///< latitude of the grid's centre, 0.5"
  std::int32_t lambda0 = 0;                               ///< longitude of the grid's centre, 0.5"
  std::uint32_t dPhi = 0;                                 ///< spacing in latitude, 0.5"
  std::uint32_t dLambda = 0;                              ///< spacing in longitude, 0.5"
  std::int32_t meanDPhi = 0;                              ///< mean latitude residual, 0.001"
  std::int32_t meanDLambda = 0;                           ///< mean longitude residual, 0.001"
  std::int32_t meanDH = 0;                                ///< mean height residual, 0.01 m
  std::int32_t residualPhi[kResidualGridPoints] = {};     ///< latitude residuals, 0.00003"
  std::int32_t residualLambda[kResidualGridPoints] = {};  ///< longitude residuals, 0.00003"
  std::int32_t residualH[kResidualGridPoints] = {};       ///< height residuals, 0.001 m

  Rtcm1023() { messageType = 23; }
};

/// Message 1024: residuals on a plane grid of 4 by 4 points centred on its origin.
struct Rtcm1024 : RtcmTableMessage {
  std::int32_t north0 = 0;                           ///< northing of the grid's centre, 10 m
  std::uint32_t east0 = 0;                           ///< easting of the grid's centre, 10 m
  std::uint32_t dN = 0;                              ///< spacing in northing, 10 m
  std::uint32_t dE = 0;                              ///< spacing in easting, 10 m
  std::int32_t meanDN = 0;                           ///< mean northing residual, 0.01 m
  std::int32_t meanDE = 0;                           ///< mean easting residual, 0.01 m
  std::int32_t meanDh = 0;                           ///< mean height residual, 0.01 m
  std::int32_t residualN[kResidualGridPoints] = {};  ///< northing residuals, 0.001 m
  std::int32_t residualE[kResidualGridPoints] = {};  ///< easting residuals, 0.001 m
  std::int32_t residualH[kResidualGridPoints] = {};  ///< height residuals, 0.001 m

  Rtcm1024() { messageType = 24; }
};

/// Message 1025: projections other than Lambert conic with two parallels and oblique Mercator.
struct Rtcm1025 : RtcmMessage {
  std::uint32_t projectionType = 0;  ///< projection type code (DF170)
  std::int64_t laNO = 0;             ///< latitude of the natural origin, 1.1e-8 degree
  std::int64_t loNO = 0;             ///< longitude of the natural origin, 1.1e-8 degree
  std::uint32_t addSNO = 0;          ///< scale at the natural origin less 993 000 ppm, 0.00001 ppm
  std::uint64_t fe = 0;              ///< false easting, 0.001 m
  std::int64_t fn = 0;               ///< false northing, 0.001 m

  Rtcm1025() { messageType = 25; }
};

/// Message 1026: Lambert conic conformal with two standard parallels. Ingestion refuses it.
/// A type of its own, outside the family of `RtcmMessage`.
struct Rtcm1026 {
  std::uint32_t messageType = 26;    ///< message number less 1000
  std::uint32_t systemId = 0;        ///< System Identification Number
  std::uint32_t projectionType = 0;  ///< projection type code (DF170)
  std::int64_t laFO = 0;             ///< latitude of the false origin, 1.1e-8 degree
  std::int64_t loFO = 0;             ///< longitude of the false origin, 1.1e-8 degree
  std::int64_t laSP1 = 0;            ///< latitude of standard parallel 1, 1.1e-8 degree
  std::int64_t laSP2 = 0;            ///< latitude of standard parallel 2, 1.1e-8 degree
  std::uint64_t efo = 0;             ///< easting of the false origin, 0.001 m
  std::int64_t nfo = 0;              ///< northing of the false origin, 0.001 m

  Rtcm1026() = default;
  Rtcm1026(const Rtcm1026&) = default;
  Rtcm1026& operator=(const Rtcm1026&) = default;
  virtual ~Rtcm1026() = default;
};

/// Message 1027: oblique Mercator, rectified or not.
struct Rtcm1027 : RtcmMessage {
  std::uint32_t projectionType = 0;  ///< projection type code (DF170)
  bool rectificationFlag = false;    ///< the projection is rectified
  std::int64_t laPC = 0;             ///< latitude of the projection centre, 1.1e-8 degree
  std::int64_t loPC = 0;             ///< longitude of the projection centre, 1.1e-8 degree
  std::uint64_t azIL = 0;            ///< azimuth of the initial line, 1.1e-8 degree
  std::int32_t diffARSG = 0;         ///< angle from the rectified to the skew grid less `azIL`,
                                     ///< 1.1e-8 degree
  std::uint64_t addSIL = 0;          ///< scale on the initial line less 993 000 ppm, 0.00001 ppm
  std::uint64_t epc = 0;             ///< easting at the projection centre, 0.001 m
  std::int64_t npc = 0;              ///< northing at the projection centre, 0.001 m

  Rtcm1027() { messageType = 27; }
};

/// Which further messages belong to a datum message.
struct UtilizedMsgInfo {
  bool use1023 = false;  ///< bit 0 of the datum message's indicator
  bool use1024 = false;  ///< bit 1
  bool use1025 = false;  ///< bit 2
  bool use1026 = false;  ///< bit 3
  bool use1027 = false;  ///< bit 4
  /// System Identification Number of the datum message, -1 when there is none.
  std::int32_t systemId = -1;
};

/// The first message that a datum message can announce; the last is 1027.
inline constexpr unsigned kFirstAnnounced = 1023;

/// The flags of the messages 1023 to 1027, in this order.
inline constexpr bool UtilizedMsgInfo::*kMessageFlags[] = {
    &UtilizedMsgInfo::use1023, &UtilizedMsgInfo::use1024, &UtilizedMsgInfo::use1025,
    &UtilizedMsgInfo::use1026, &UtilizedMsgInfo::use1027};

/// The bit of a datum message's `utilizedMsgIndicator` that announces a message, 1023 to 1027.
constexpr std::uint32_t AnnouncementBit(unsigned number) {
  return std::uint32_t{1} << (number - kFirstAnnounced);
}

/// The messages received for one transformation. The records stay the caller's; a copy of the
/// set points at the same records.
struct MsgUtilized {
  const Rtcm1021* msg1021 = nullptr;  ///< the datum message, or null
  const Rtcm1022* msg1022 = nullptr;  ///< the datum message, or null
  const Rtcm1023* msg1023 = nullptr;  ///< the datum's residual grid, or null
  const Rtcm1024* msg1024 = nullptr;  ///< the projection's residual grid, or null
  const Rtcm1025* msg1025 = nullptr;  ///< the projection, or null
  const Rtcm1026* msg1026 = nullptr;  ///< the projection, or null
  const Rtcm1027* msg1027 = nullptr;  ///< the projection, or null
  UtilizedMsgInfo info;               ///< what GetUtilizedMessageInfo() says of the datum message
};

}  // namespace orx::cs::velta
