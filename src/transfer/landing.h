// Where the bytes of a run that writes a local file go: under a private name beside the file's
// place, so that they take it whole or not at all; or over what stands there.
#ifndef ZARVO_TRANSFER_LANDING_H
#define ZARVO_TRANSFER_LANDING_H

#include <string_view>

#include "frame/owner.h"
#include "platform/platform.h"
#include "transfer/run.h"

namespace zv {

// Each step gives `copied`, or the code with which the run has failed. What is not committed leaves
// nothing, except where it was written in place.
class Landing {
 public:
  explicit Landing(Run& run) : run_(run) {}
  ~Landing();
  Landing(const Landing&) = delete;
  Landing& operator=(const Landing&) = delete;

  // Before anything moves: whether a file may land at the path, which outlives this. `source` is
  // the file that is copied, when it is a local one.
  [[nodiscard]] int check(const char* path, const platform::OpenFile& source = {});

  // Once there is something to write. A new file gets the bits, less those that the process
  // withholds.
  [[nodiscard]] int open(unsigned bits = 0666);

  [[nodiscard]] int write(std::string_view bytes);
  FILE* file() const { return file_.get(); }  // for what the system writes by itself

  // All is written. Once the file has its place, nothing undoes it.
  [[nodiscard]] int commit();

 private:
  int check_place(const platform::OpenFile& source);
  int check_replacement();
  int open_whole(unsigned bits);
  int open_in_place(unsigned bits);
  int refuse(std::string_view why);
  int refuse_late(int error);
  int refuse_same();
  int fail(int cause, std::string_view step);
  bool stands_file() const { return place_.standing == platform::Standing::file; }

  Run& run_;
  const char* path_ = "";
  platform::OpenFile source_;
  platform::Place place_;
  bool in_place_ = false;
  platform::PrivateName name_;  // empty when there is no file of that name
  StreamPtr file_;
};

}  // namespace zv

#endif
