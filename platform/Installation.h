// What kind of installation this is.
//
// Called on the thread of the run.
#pragma once

namespace norvex {

class Installation {
 public:
  virtual ~Installation() = default;

  // True on a machine of the maker's own staff, the only ones on which exact folder figures are measured and
  // reported. False whenever that cannot be told.
  virtual bool isInternalInstall() = 0;
};

}  // namespace norvex
