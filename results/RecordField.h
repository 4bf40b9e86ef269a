// How a constant table names a field of the record: by its getter, so that the compiler knows the field's
// type and a field of the wrong kind does not fit.
#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "results/NVXScannerResults.h"

namespace norvex {

// A size in bytes or a count of objects.
using FigureGetter = std::uint64_t (NVXScannerResults::*)() const;
using SettingGetter = bool (NVXScannerResults::*)() const;
// Text that may be absent (null).
using TextGetter = const std::shared_ptr<const std::string>& (NVXScannerResults::*)() const;

}  // namespace norvex
