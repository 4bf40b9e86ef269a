// The index of the metadata of whole volumes: queries over a volume, and one item's attributes by path.
//
// Queries are made, started and waited for on the thread of the run. Their results are read on the main
// thread, after the query has been stopped and while the run waits. Items are used on the thread of the run.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "platform/Location.h"

namespace norvex {

// A value of an attribute: text, a number, a moment (seconds since 1970) or several whole numbers.
struct MetadataDate {
  double secondsSince1970 = 0;
};
using MetadataValue = std::variant<std::string, double, std::int64_t, MetadataDate, std::vector<std::int64_t>,
                                   std::vector<std::string>>;

// Attributes that the agent names.
inline constexpr std::string_view kMDItemPath = "kMDItemPath";                  // text
inline constexpr std::string_view kMDItemPurchaseDate = "kMDItemPurchaseDate";  // only presence counts
inline constexpr std::string_view kMDStoreLastHealthCheck =
    "kMDStoreLastHealthCheck";  // volume roots; a date
inline constexpr std::string_view kMDStoreAccumulatedSizes =
    "kMDStoreAccumulatedSizes";  // volume roots; 18 numbers

// One match of a query, or one item that was asked for by its path.
class MetadataResult {
 public:
  virtual ~MetadataResult() = default;

  // The value of the attribute, absent when the item has none.
  virtual std::optional<MetadataValue> valueForAttribute(std::string_view attribute) const = 0;
};

class MetadataQuery {
 public:
  using FinishObserver = std::function<void(MetadataQuery&)>;
  using ObserverToken = std::uint64_t;

  virtual ~MetadataQuery() = default;

  // What to look for, where, and the attributes that the caller is going to read; all before start().
  virtual void setPredicate(std::string predicate) = 0;
  virtual void setValueListAttributes(std::vector<std::string> attributes) = 0;
  virtual void setSearchScopes(std::vector<Location> scopes) = 0;

  // `observer` is called once, on the main task queue, when every match has been gathered - unless it has
  // been removed by then.
  virtual ObserverToken addFinishObserver(FinishObserver observer) = 0;

  // From now on the observer is not called any more. When it is being called on another thread, returns only
  // after that call: whatever the observer has done is then visible to the caller.
  virtual void removeFinishObserver(ObserverToken token) = 0;

  // Begins to gather matches, as inputs of the calling thread's event loop. False when it cannot: the
  // predicate does not parse or the volume's store is damaged; then nothing is gathered and no observer is
  // called.
  virtual bool start() = 0;

  // Ends the gathering; from now on the query is stopped. May be called on another thread than start(), whose
  // loop's pass it then ends at once.
  virtual void stop() = 0;
  virtual bool isStopped() const = 0;

  // The matches, in the index's order; valid once stopped. `index` is below resultCount(). A result is made
  // when it is asked for and belongs to the caller.
  virtual std::size_t resultCount() const = 0;
  virtual std::unique_ptr<MetadataResult> resultAtIndex(std::size_t index) const = 0;
};

class MetadataIndex {
 public:
  virtual ~MetadataIndex() = default;

  virtual std::unique_ptr<MetadataQuery> createQuery() = 0;

  // The index's item for a path; nullptr when the index has none.
  virtual std::unique_ptr<MetadataResult> itemAtPath(const std::string& path) = 0;
};

}  // namespace norvex
