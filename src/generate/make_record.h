#pragma once

#include <boost/make_shared.hpp>
#include <boost/shared_ptr.hpp>

#include "orxutils/orx_dl_allocator.h"

namespace orx::cs::velta {

/// A copy of a record whose memory another module may free.
template <class Record>
boost::shared_ptr<Record> MakeRecord(const Record& record) {
  return boost::allocate_shared<Record>(orx_dl_allocator<Record>(), record);
}

}  // namespace orx::cs::velta
