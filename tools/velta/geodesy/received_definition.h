#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "geodesy/definition.h"
#include "rtcm3/message_sets.h"

namespace velta_tool {

/// What the message sets of one system define, under the names that their entries would have. What
/// comes again takes the place of what came before.
class ReceivedDefinition {
 public:
  /// \param set has a datum message
  void Add(const orx::cs::velta::rtcm3::MessageSet& set);

  const Definition& definition() const { return definition_; }
  /// The names of the target systems, as they were received.
  const std::vector<std::string>& targets() const { return targets_; }
  /// How many values have become others.
  std::size_t changes() const { return changes_; }

 private:
  void AddArea(const orx::cs::velta::RtcmBasicTransformMessage& message,
               const orx::cs::velta::DatumData& datum, const std::string& entry);
  void AddGrid(ResidualGrid grid, std::map<std::string, std::size_t>& known,
               std::vector<ResidualGrid>& grids);
  void AddProjection(Projection projection);

  Definition definition_;
  std::vector<std::string> targets_;
  std::map<std::string, std::size_t> areas_;  ///< indices, by the names without a grid
  std::map<std::string, std::size_t> grids_;  ///< indices, by their entries' names
  std::map<std::string, std::size_t> planeGrids_;
  std::size_t changes_ = 0;
};

}  // namespace velta_tool
