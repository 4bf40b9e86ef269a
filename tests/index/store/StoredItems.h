// The store of a volume of a few real items and of as many more as a test wants, which only the store knows
// of: files named f<number> in the volume's root, whose size is their number, of the content types one, two
// and three in turn. Those of one and three are odd.
#pragma once

#include <cstdint>
#include <string>

#include "TestVolume.h"

namespace norvex {

inline void addStoredItems(const TestVolume& volume, std::int64_t first, std::int64_t count) {
  const std::string sql =
      "UPDATE items SET type=0; DELETE FROM types; DELETE FROM type_tree;"
      "INSERT INTO types VALUES(0,'zero','Zero'), (1,'one','One'), (2,'two','Two'), (3,'three','Three');"
      "INSERT INTO type_tree VALUES('odd',1), ('odd',3);"
      "WITH RECURSIVE n(id) AS (SELECT " +
      std::to_string(first) + " UNION ALL SELECT id+1 FROM n WHERE id+1<" + std::to_string(first + count) +
      ") INSERT INTO items SELECT id, 1, CAST('f' || id AS BLOB), 1 + id % 3, id, 0 FROM n;"
      "UPDATE folders SET state=1, first_child=2, child_count=" +
      std::to_string(first + count - 2) + " WHERE item=1";
  volume.tamper(sql.c_str());
}

}  // namespace norvex
