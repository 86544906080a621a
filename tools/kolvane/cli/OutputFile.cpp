#include "tools/kolvane/cli/OutputFile.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <random>
#include <system_error>

#include "platform/File.h"
#include "platform/Termination.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/Paths.h"
#include "tools/kolvane/cli/StandardOutput.h"

namespace {

namespace fs = std::filesystem;

[[noreturn]] void Fail(const std::string& name, std::string_view reason) {
  throw Failure(fmt::format("{}: {}", Printable(name), reason));
}

// Through symbolic links, also one to what is not there yet.
fs::path TargetOf(fs::path path) {
  constexpr int kMostLinks = 40;
  std::error_code error;
  for (int links = 0; links < kMostLinks && fs::is_symlink(path, error); ++links) {
    path = path.parent_path() / fs::read_symlink(path, error);
  }
  return path;
}

bool HasBytes(const fs::path& path, std::string_view bytes) {
  std::error_code error;
  if (fs::file_size(path, error) != bytes.size() || error) return false;
  const std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(
      platform::OpenFile(NameOf(path).c_str(), "rb"), &std::fclose);
  if (file == nullptr) return false;
  std::string held(bytes.size(), '\0');
  return std::fread(held.data(), 1, held.size(), file.get()) == held.size() && held == bytes;
}

// Returns the system's reason, or nothing.
std::string Write(const fs::path& path, std::string_view bytes) {
  std::FILE* const file = platform::OpenFile(NameOf(path).c_str(), "wb");
  if (file == nullptr) return std::strerror(errno);
  const bool written = std::fwrite(bytes.data(), 1, bytes.size(), file) == bytes.size();
  const int reason = errno;
  if (std::fclose(file) != 0) return std::strerror(errno);
  return written ? "" : std::strerror(reason);
}

// Goes with its file, unless that got its name in the end.
class FileBeside {
 public:
  explicit FileBeside(const fs::path& target) : path(target) {
    path += fmt::format(".{:08x}.tmp", std::random_device()());
  }
  FileBeside(const FileBeside&) = delete;
  FileBeside& operator=(const FileBeside&) = delete;
  ~FileBeside() {
    std::error_code error;
    fs::remove(path, error);
  }

  const fs::path& Path() const noexcept { return path; }

 private:
  fs::path path;
};

void Replace(const std::string& name, const fs::path& target, const fs::file_status& status,
             std::string_view bytes) {
  const platform::DelayedTermination termination;  // which would leave the file beside
  const FileBeside file(target);
  if (const std::string reason = Write(file.Path(), bytes); !reason.empty()) Fail(name, reason);
  std::error_code error;
  if (fs::exists(status)) fs::permissions(file.Path(), status.permissions(), error);
  if (!error) fs::rename(file.Path(), target, error);
  if (error) Fail(name, error.message());
}

}  // namespace

void WriteFile(const std::string& name, std::string_view bytes) {
  if (name == "-") return WriteOutput(bytes);
  std::error_code error;
  const fs::path target = TargetOf(PathOf(name));
  const fs::file_status status = fs::status(target, error);
  if (!fs::status_known(status)) Fail(name, error.message());
  if (fs::is_regular_file(status) && HasBytes(target, bytes)) return;
  if (!fs::exists(status) || fs::is_regular_file(status)) {
    return Replace(name, target, status, bytes);
  }
  if (const std::string reason = Write(target, bytes); !reason.empty()) Fail(name, reason);
}
