#include "tools/kolvane/cli/ErrorBoundary.h"

#include <fmt/format.h>

#include <exception>
#include <new>

#include "kolvane/lib/OVErrException.h"
#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/cli/StandardOutput.h"

namespace {

std::string UsageText(std::string_view command, const UsageError& error) {
  if (command.empty()) return fmt::format("{}\ntry 'kolvane --help'", error.what());
  return fmt::format("{0}: {1}\ntry 'kolvane {0} --help'", command, error.what());
}

}  // namespace

ExitStatus Guard(std::string_view command, const std::function<ExitStatus()>& action) {
  try {
    return action();
  } catch (const CommandLine::HelpPrinted&) {
    return ExitStatus::kDone;
  } catch (const UsageError& error) {
    Say(UsageText(command, error));
  } catch (const ClosedPipe&) {
  } catch (const OVErrException& error) {
    Say(fmt::format("a text could not be converted (code {:#010x})", error.Code()));
  } catch (const std::bad_alloc&) {
    Say("out of memory");
  } catch (const std::exception& error) {
    Say(error.what());
  }
  return ExitStatus::kNotDone;
}
