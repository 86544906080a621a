#include "bench/kolvane/lib/Subprocess.h"

#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <exception>
#include <stdexcept>
#include <system_error>

namespace {

void WriteAll(int pipeEnd, const std::string& text) {
  for (size_t done = 0; done < text.size();) {
    const ssize_t count = write(pipeEnd, text.data() + done, text.size() - done);
    if (count <= 0) throw std::system_error(errno, std::generic_category(), "write");
    done += static_cast<size_t>(count);
  }
}

std::string ReadToEnd(int pipeEnd) {
  std::string text;
  char part[4096];
  while (true) {
    const ssize_t count = read(pipeEnd, part, sizeof part);
    if (count <= 0) return text;
    text.append(part, static_cast<size_t>(count));
  }
}

// Ends the child without running the parent's destructors and exit handlers.
[[noreturn]] void RunAsChild(const std::function<std::string()>& work, int pipeEnd) {
  int status = 1;
  try {
    WriteAll(pipeEnd, work());
    status = 0;
  } catch (const std::exception& error) {
    std::fprintf(stderr, "dictionary-bench: %s\n", error.what());
  }
  std::fflush(nullptr);
  _exit(status);
}

}  // namespace

std::string RunInChild(const std::function<std::string()>& work) {
  int ends[2];
  if (pipe(ends) != 0) throw std::system_error(errno, std::generic_category(), "pipe");
  std::fflush(nullptr);
  const pid_t child = fork();
  if (child < 0) throw std::system_error(errno, std::generic_category(), "fork");
  if (child == 0) RunAsChild(work, ends[1]);
  close(ends[1]);
  std::string result = ReadToEnd(ends[0]);
  close(ends[0]);
  int status = 0;
  waitpid(child, &status, 0);
  if (status != 0) throw std::runtime_error("a measurement failed");
  return result;
}
