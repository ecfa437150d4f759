#pragma once

#include <string>
#include <vector>

namespace velta_tool {

/// Shows on standard error, when that is a terminal, what is done with files so large that it takes
/// a while.
class Busy {
 public:
  /// \param what is done, such as "reading"
  /// \param files with which; an empty name is none
  Busy(const std::string& what, std::vector<std::string> files);
  ~Busy();
  Busy(const Busy&) = delete;
  Busy& operator=(const Busy&) = delete;
};

}  // namespace velta_tool
