#include "index/StorageClasses.h"

#include "index/GlobPattern.h"
#include "index/TypeTables.h"

namespace norvex {

StoragePosition positionOfType(std::string_view typeName) {
  for (const PositionRow& row : positionRows()) {
    for (const std::string_view pattern : row.typePatterns) {
      if (globMatches(pattern, typeName)) return row.position;
    }
  }
  return StoragePosition::other;
}

StoragePosition positionOf(const ContentType& type, const ItemContext& context) {
  // The rows of applications and mail stand above all others, so a type below them never has to be weighed
  // against the context.
  const bool unknownProgram = context.executable && !type.isKnown;
  if (context.insideApplication || unknownProgram) return StoragePosition::applications;
  if (type.position == StoragePosition::applications) return StoragePosition::applications;
  if (context.inMaildir) return StoragePosition::messages;
  return type.position;
}

}  // namespace norvex
