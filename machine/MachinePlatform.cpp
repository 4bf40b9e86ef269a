#include "machine/MachinePlatform.h"

namespace norvex {

MachinePlatform::MachinePlatform(int argc, const char* const* argv, const Environment& environment,
                                 SystemLog& systemLog)
    : linux_(argc, argv, environment, systemLog),
      storeFolder_(linux_.folders().cache + "/norvex"),
      stores_(storeFolder_),
      metadataIndex_(stores_, linux_.eventLoops()),
      volumeCatalog_(stores_, linux_.volumeCatalog()),
      roles_(linux_.roles(metadataIndex_, volumeCatalog_)) {}

}  // namespace norvex
