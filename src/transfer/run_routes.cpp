// Picks the road between the two locations of a run.
#include "transfer/run_routes.h"

#include "transfer/landing.h"
#include "transfer/local.h"
#include "transfer/network.h"
#include "transfer/percent.h"
#include "transfer/result.h"
#include "transfer/run_ftp.h"
#include "transfer/run_http.h"
#include "transfer/run_location.h"
#include "transfer/run_smtp.h"
#include "transfer/temporary_file.h"

namespace zv {

namespace {

bool fail(Run& run, int code, int cause, std::string_view why) {
  run.fail(code, cause, 0, {why});
  return false;
}

// The login that was given wins over the location's. Reasons never show its password.
bool take_login(Run& run, int code, const Login& login, RunLocation& location) {
  if (!location.is_network()) return true;
  if (login.is_given &&
      !(location.user.assign(login.user.view()) && location.password.assign(login.password.view())))
    return fail(run, code, ZV_CAUSE_MEMORY, "out of memory");
  if (location.kind == LOC_HTTP && location.user.view().find(':') != std::string_view::npos)
    return fail(run, code, ZV_CAUSE_LOCATION, "a user with a colon");
  return run.keep_secret(location.password.view()) ||
         fail(run, code, ZV_CAUSE_MEMORY, "out of memory");
}

bool download(Run& run, const RunLocation& source, const char* local) {
  Landing landing(run);
  if (landing.check(local) != copied) return false;
  return source.kind == LOC_FTP ? ftp_retrieve(run, source, landing)
                                : http_fetch(run, source, landing);
}

bool upload(Run& run, const char* local, const RunLocation& destination) {
  constexpr size_t block_size = size_t{512} * 1024;
  RunSource file(run, block_size);
  if (!file.open(local)) return false;
  switch (destination.kind) {
    case LOC_FTP:
      return ftp_store(run, file, destination);
    case LOC_HTTP:
      return http_store(run, file, destination);
    default:
      return smtp_send(run, file, local, destination);
  }
}

// The file between takes the name of the source's, without the query of a URL.
bool name_between(const RunLocation& source, HeapText& name) {
  const std::string_view path = source.path.view();
  if (source.kind != LOC_HTTP) return name.assign(path);
  if (!name.assign({path.data(), std::min(path.find('?'), path.size())})) return false;
  name.edit_shrinking(percent_decode);
  return true;
}

bool relay(Run& run, const RunLocation& source, const RunLocation& destination) {
  HeapText name;
  if (!name_between(source, name))
    return fail(run, source_failed, ZV_CAUSE_MEMORY, "out of memory");
  TemporaryFile file;
  if (!file.prepare(name.c_str()))
    return fail(run, source_failed, ZV_CAUSE_LOCAL, "no temporary file of the source's name");

  // It is new, private, and gone at the end.
  const Options wanted = run.options();
  Options between = wanted;
  between.in_place = true;
  between.keep = between.sync = false;
  run.use(between);
  const bool downloaded = download(run, source, file.path());
  run.use(wanted);
  return downloaded && upload(run, file.path(), destination);
}

}  // namespace

bool transfer(Run& run, const Logins& logins, const char* from, const char* to) {
  RunLocation source;
  RunLocation destination;
  if (!run.may_go_on(source_failed) || !parse_run_location(run, source_failed, from, source))
    return false;
  if (source.kind == LOC_SMTP)
    return fail(run, source_failed, ZV_CAUSE_LOCATION, "source: a mail is no source");
  if (!parse_run_location(run, destination_failed, to, destination) ||
      !take_login(run, source_failed, logins[0], source) ||
      !take_login(run, destination_failed, logins[1], destination))
    return false;

  // What encrypts must be there before anything goes out.
  if ((source.is_encrypted && !run.trust()->prepare(run, source_failed)) ||
      (destination.is_encrypted && !run.trust()->prepare(run, destination_failed)))
    return false;

  const char* const source_path = source.local.c_str();
  const char* const destination_path = destination.local.c_str();
  if (!source.is_network() && !destination.is_network())
    return copy_local(run, source_path, destination_path) == copied;
  const NetworkGuard network;
  if (!network.started())
    return fail(run, source.is_network() ? source_failed : destination_failed, ZV_CAUSE_LOCAL,
                "the network cannot be used");
  if (!source.is_network()) return upload(run, source_path, destination);
  if (!destination.is_network()) return download(run, source, destination_path);
  return relay(run, source, destination);
}

}  // namespace zv
