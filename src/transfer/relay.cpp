// The two legs of a copy between two network locations.
#include "transfer/relay.h"

#include "transfer/result.h"
#include "transfer/routes.h"
#include "transfer/temporary_file.h"

namespace zv {

int relay(const Location& source, const Location& destination) {
  TemporaryFile file;
  if (!file.prepare(source.path.c_str())) return source_failed;
  const int result = download(source, file.path());
  return result == copied ? upload(file.path(), destination) : result;
}

}  // namespace zv
