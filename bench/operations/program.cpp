#include "program.h"

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace bench {

namespace {

pid_t start(const Command& command, const posix_spawn_file_actions_t* actions) {
  std::vector<char*> arguments;
  for (const std::string& word : command) arguments.push_back(const_cast<char*>(word.c_str()));
  arguments.push_back(nullptr);
  pid_t child = 0;
  const int error = posix_spawnp(&child, arguments[0], actions, nullptr, arguments.data(), environ);
  return error == 0 ? child : -1;
}

bool ends_well(pid_t child) {
  int status = 0;
  return child > 0 && waitpid(child, &status, 0) == child && status == 0;
}

void read_all(int from, std::string& output) {
  constexpr size_t block = size_t{1} << 16;
  ssize_t got = 0;
  do {
    const size_t size = output.size();
    output.resize(size + block);
    got = read(from, output.data() + size, block);
    output.resize(size + static_cast<size_t>(got > 0 ? got : 0));
  } while (got > 0);
}

}  // namespace

bool run_program(const Command& command) {
  return ends_well(start(command, nullptr));
}

bool read_program(const Command& command, std::string& output) {
  int ends[2];
  if (pipe2(ends, O_CLOEXEC) != 0) return false;
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, ends[1], STDOUT_FILENO);
  const pid_t child = start(command, &actions);
  posix_spawn_file_actions_destroy(&actions);
  close(ends[1]);
  read_all(ends[0], output);
  close(ends[0]);
  return ends_well(child);
}

}  // namespace bench
