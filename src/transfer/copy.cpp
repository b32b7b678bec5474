// zv_copy(): picks the road between two locations.
#include "transfer/local.h"
#include "transfer/location.h"
#include "transfer/relay.h"
#include "transfer/result.h"
#include "transfer/routes.h"

int zv_copy(const char* from, const char* to) {
  zv::Location source;
  zv::parse_location(from, source);
  if (source.kind == zv::LOC_NONE || source.kind == zv::LOC_SMTP) return zv::source_failed;

  zv::Location destination;
  zv::parse_location(to, destination);
  if (destination.kind == zv::LOC_NONE) return zv::destination_failed;

  const bool from_local = source.kind == zv::LOC_FILE;
  const bool to_local = destination.kind == zv::LOC_FILE;
  if (from_local && to_local) return zv::copy_local(source.path.c_str(), destination.path.c_str());
  if (from_local) return zv::upload(source.path.c_str(), destination);
  if (to_local) return zv::download(source, destination.path.c_str());
  return zv::relay(source, destination);
}
