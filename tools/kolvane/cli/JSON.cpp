#include "tools/kolvane/cli/JSON.h"

#include "tools/kolvane/cli/StandardOutput.h"

void WriteJSON(const nlohmann::ordered_json& value) {
  constexpr int kIndent = 2;
  using ErrorHandler = nlohmann::ordered_json::error_handler_t;
  WriteOutput(value.dump(kIndent, ' ', false, ErrorHandler::replace) + '\n');
}
