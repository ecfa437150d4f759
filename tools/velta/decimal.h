#pragma once

#include <string>

namespace velta_tool {

/// True when two numbers differ by no more than the rounding of their computation. The smallest
/// step of a message is ten times as large, that of the scale factor.
bool IsSameNumber(double a, double b);

/// The number with the fewest digits that is the same but for rounding, or to a hundredth of
/// a step.
/// \param step of the field that it is from, 0 when it is not known
double Shortest(double number, double step);

/// The same as text, without an exponent but for what no message can hold.
std::string ShortestText(double number, double step);

}  // namespace velta_tool
