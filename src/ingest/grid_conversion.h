#pragma once

#include "velta/rtcm_messages.h"
#include "velta/table_data.h"

namespace orx::cs::velta {

/// Converts an ellipsoidal grid to radians and metres. Every value is accepted; the reserved
/// members of the table stay.
void ConvertEllipsoidalGrid(const Rtcm1023& message, TableData& table);

/// Converts a plane grid to metres, likewise.
void ConvertPlaneGrid(TableData& table, const Rtcm1024& message);

}  // namespace orx::cs::velta
