#include "platform/linux/DiagnosticMessageText.h"

#include <nlohmann/json.hpp>

namespace norvex {

std::string diagnosticMessageJson(std::string_view domain, int level, std::span<const DiagnosticPair> pairs,
                                  std::optional<std::string_view> time) {
  using Json = nlohmann::ordered_json;
  Json pairList = Json::array();
  for (const DiagnosticPair& pair : pairs) pairList.push_back(Json::array({pair.key, pair.value}));
  Json message = {{"domain", domain}, {"level", level}, {"pairs", std::move(pairList)}};
  if (time) message["time"] = *time;
  // Replacing is the one way of dumping that cannot throw.
  return message.dump(-1, ' ', false, Json::error_handler_t::replace);
}

}  // namespace norvex
