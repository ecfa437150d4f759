#pragma once

#include <memory>
#include <string>

struct pj_ctx;
struct PJconsts;

namespace velta_tool {

/// A place: latitude and longitude, radians, or northing and easting, metres, and a height, metres.
struct Coordinates {
  double north;
  double east;
  double height;
};

/// What PROJ keeps for the operations of one thread.
class ProjContext {
 public:
  ProjContext();

  pj_ctx* get() const { return context_.get(); }
  /// What PROJ said first since, which is nearest to the cause, or what an error code of it means.
  std::string Reason(int code) const;
  void ForgetReason() { said_->clear(); }

 private:
  std::unique_ptr<std::string> said_;
  std::shared_ptr<pj_ctx> context_;
};

/// A pipeline of PROJ.
class ProjOperation {
 public:
  /// \param steps as DatumSteps() and ProjectionSteps() give them
  /// \throws NotTransformable with PROJ's reason
  ProjOperation(ProjContext& context, const std::string& steps);

  /// \throws NotTransformable with PROJ's reason
  Coordinates Forward(const Coordinates& from) const;
  Coordinates Inverse(const Coordinates& from) const;

 private:
  Coordinates Do(bool isForward, const Coordinates& from) const;

  ProjContext* context_;
  std::shared_ptr<PJconsts> operation_;
};

}  // namespace velta_tool
