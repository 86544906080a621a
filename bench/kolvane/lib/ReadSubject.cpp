// Reads an image's file into fresh memory: the lower bound for loads.
#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <system_error>

#include "bench/kolvane/lib/Images.h"
#include "bench/kolvane/lib/Subjects.h"

namespace {

[[noreturn]] void Fail(const char* what) {
  throw std::system_error(errno, std::generic_category(), what);
}

class ReadSubject final : public Subject {
 public:
  ReadSubject(const char* subjectName, const std::filesystem::path& imagePath)
      : Subject(subjectName, AnswerEncoding::kNothing),
        path(imagePath),
        size(file_size(imagePath)) {}

  void Load() override {
    memory = mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED) Fail("mmap");
    const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0) Fail("open");
    ReadAll(file);
    close(file);
  }

  void Unload() override { munmap(memory, size); }

 private:
  void ReadAll(int file) {
    for (size_t done = 0; done < size;) {
      const ssize_t count = read(file, static_cast<char*>(memory) + done, size - done);
      if (count <= 0) Fail("read");
      done += static_cast<size_t>(count);
    }
  }

  const std::filesystem::path path;
  const size_t size;
  void* memory = nullptr;
};

std::unique_ptr<Subject> Make(const char* name, ImageKind kind, const KeySet& set,
                              const std::filesystem::path& folder) {
  return std::make_unique<ReadSubject>(name, ImageFile(kind, set, folder));
}

}  // namespace

std::unique_ptr<Subject> MakeReadUTF16(const KeySet& set, const std::filesystem::path& folder) {
  return Make("read-utf16", ImageKind::kUTF16, set, folder);
}

std::unique_ptr<Subject> MakeReadCodePage(const KeySet& set, const std::filesystem::path& folder) {
  return Make("read-code-page", ImageKind::kCodePage, set, folder);
}

std::unique_ptr<Subject> MakeReadBinary(const KeySet& set, const std::filesystem::path& folder) {
  return Make("read-binary", ImageKind::kBinary, set, folder);
}
