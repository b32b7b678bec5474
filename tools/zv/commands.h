// The tool's commands: what each is told on the command line, and the function that does it and
// gives the exit code. command_line.cpp fills the options in.
#ifndef ZV_TOOL_COMMANDS_H
#define ZV_TOOL_COMMANDS_H

#include <climits>
#include <optional>
#include <string>

namespace tool {

// As a shell user expects them; a copy tells which side failed, and 128 and the signal that ended
// it.
enum ExitCode { done = 0, no = 1, wrong_usage = 2, source_failed = 3, destination_failed = 4 };

struct CopyOptions {
  std::string from;
  std::string to;
  std::string user;
  std::string password_file;
  std::string ca;
  std::optional<double> timeout;   // seconds
  std::optional<double> max_time;  // seconds
  int retries = 2;
  bool no_clobber = false;
  bool in_place = false;
  bool sync = false;
  bool quiet = false;
};
int copy(const CopyOptions& options);

struct ScanOptions {
  std::string folder;
  std::string files;
  std::string folders;
  bool recursive = false;
  bool hidden = false;
  bool match_case = false;
  bool json = false;
};
int scan(const ScanOptions& options);

struct MatchOptions {
  std::string text;
  std::string pattern;
};
int match(const MatchOptions& options);

struct PathOptions {
  std::string path;
  std::string base;  // empty: the current folder
  bool json = false;
};
int path_normalize(const PathOptions& options);
int path_absolute(const PathOptions& options);
int path_relative(const PathOptions& options);
int path_split(const PathOptions& options);
int path_locate(const PathOptions& options);

struct RemoveOptions {
  std::string folder;
  bool agreed = false;
};
int remove(const RemoveOptions& options);

struct PluginsOptions {
  std::string api;
  std::string folder = ".";
  int oldest = 0;
  int newest = INT_MAX;
  bool json = false;
};
int plugins(const PluginsOptions& options);

struct InfoOptions {
  bool json = false;
};
int info(const InfoOptions& options);

// A message for a person, on standard error; with the system's words for errno's number `error`,
// unless that is 0.
void complain(const std::string& message, int error = 0);

}  // namespace tool

#endif
