#include <stdexcept>

#include "geodesy/exports.h"

namespace velta_tool {

std::string Wkt(const Definition&, std::size_t, const TellLeftOut&) {
  throw std::runtime_error("wkt is not there yet");
}

}  // namespace velta_tool
