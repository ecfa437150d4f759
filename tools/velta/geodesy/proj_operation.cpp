#include "geodesy/proj_operation.h"

#include <proj.h>

#include <cmath>

#include "geodesy/proj_steps.h"

namespace velta_tool {

ProjContext::ProjContext()
    : said_(std::make_unique<std::string>()),
      context_(proj_context_create(), proj_context_destroy) {
  proj_log_func(context_.get(), said_.get(),
                [](void* said, int, const char* text) { *static_cast<std::string*>(said) = text; });
}

std::string ProjContext::Reason(int code) const {
  if (!said_->empty()) return *said_;
  const char* const text = proj_context_errno_string(context_.get(), code);
  return text ? text : "an unknown error";
}

ProjOperation::ProjOperation(ProjContext& context, const std::string& steps) : context_(&context) {
  context.ForgetReason();
  operation_.reset(proj_create(context.get(), ("+proj=pipeline" + steps).c_str()), proj_destroy);
  if (!operation_) {
    throw NotTransformable("PROJ refuses it: " + context.Reason(proj_context_errno(context.get())));
  }
}

Coordinates ProjOperation::Forward(const Coordinates& from) const { return Do(true, from); }

Coordinates ProjOperation::Inverse(const Coordinates& from) const { return Do(false, from); }

Coordinates ProjOperation::Do(bool isForward, const Coordinates& from) const {
  const PJ_COORD to = proj_trans(operation_.get(), isForward ? PJ_FWD : PJ_INV,
                                 proj_coord(from.east, from.north, from.height, 0));
  const bool isFinite =
      std::isfinite(to.xyz.x) && std::isfinite(to.xyz.y) && std::isfinite(to.xyz.z);
  if (isFinite) return {to.xyz.y, to.xyz.x, to.xyz.z};
  const int code = proj_errno(operation_.get());
  proj_errno_reset(operation_.get());
  throw NotTransformable("PROJ cannot transform it: " + context_->Reason(code));
}

}  // namespace velta_tool
