#pragma once

#include "velta/rtcm_messages.h"
#include "velta/table_data.h"

/// Between the fields of a grid message and a residual grid in radians and metres.
namespace orx::cs::velta {

/// Converts an ellipsoidal grid to radians and metres. Every value is accepted; the reserved
/// members of the table stay.
void ConvertEllipsoidalGrid(const Rtcm1023& message, TableData& table);

/// Converts a plane grid to metres, likewise.
void ConvertPlaneGrid(TableData& table, const Rtcm1024& message);

/// Converts a grid to the message's integers, toward zero. The centre is that of `bounds`.
void ConvertGrid(const TableData& table, Rtcm1023& message);
void ConvertGrid(const TableData& table, Rtcm1024& message);

}  // namespace orx::cs::velta
