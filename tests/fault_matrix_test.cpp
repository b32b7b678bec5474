// Every reply of every dialogue, with every fault that a reply can have: each copy ends in the
// documented result, at once, with nothing left open.
#include <gtest/gtest.h>

#include <chrono>
#include <string>

#include "fixtures/dialogues.h"
#include "handle.h"
#include "zarvo.h"

namespace {

using namespace scripted;

constexpr Fault faults[] = {Fault::wrong_code, Fault::cut_short, Fault::no_number, Fault::close,
                            Fault::reset,      Fault::bytewise,  Fault::with_next};
constexpr Fault faults_of_handles[] = {Fault::wrong_code, Fault::cut_short, Fault::no_number,
                                       Fault::close,      Fault::reset,     Fault::slowly,
                                       Fault::together};

int run(const Route& route, Fault fault) {
  const HandlePtr handle = new_handle();
  // What is cut short is waited for.
  if (fault == Fault::cut_short) zv_transfer_set(handle.get(), ZV_TRANSFER_SILENCE, 100);
  const int result = zv_transfer_run(handle.get(), route.from.c_str(), route.to.c_str());
  EXPECT_EQ(result == 0, zv_transfer_cause(handle.get(), nullptr) == ZV_CAUSE_NONE);
  EXPECT_EQ(result == 0, reason(handle.get()).empty());
  return result;
}

int copy_against(const Dialogue& dialogue, bool with_handle, Fault fault, size_t step,
                 const ScratchFolder& folder) {
  DialogueServer server(dialogue.steps, fault, step);
  const Route route(dialogue, server, folder);
  const auto begin = std::chrono::steady_clock::now();
  const int result =
      with_handle ? run(route, fault) : zv_copy(route.from.c_str(), route.to.c_str());
  // Far from a hang, even on a busy machine under Wine.
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
  EXPECT_TRUE(result != 0 || arrived(dialogue, server, folder));
  return result;
}

// Some bytes of a body can take the place of others.
bool is_tried(const Dialogue& dialogue, size_t number, bool with_handle, Fault fault) {
  const Step& step = dialogue.steps[number];
  if (step.said.empty() || step.survived == never_said) return false;
  if (step.survived == handle_only && !with_handle) return false;
  if (fault == Fault::together && number + 1 < dialogue.steps.size() &&
      dialogue.steps[number + 1].survived == never_said)
    return false;
  if (step.heard == data_out && (fault == Fault::with_next || fault == Fault::together))
    return false;
  const bool is_http_body = dialogue.scheme == std::string("http") && step.heard == unasked;
  return !(with_handle && is_http_body &&
           (fault == Fault::wrong_code || fault == Fault::no_number));
}

void check_matrix(bool with_handle) {
  const ScratchFolder folder;
  folder.make_file("file", "hello");
  for (const Dialogue& dialogue : dialogues()) {
    const int handles = open_handles();
    EXPECT_EQ(copy_against(dialogue, with_handle, Fault::none, 0, folder), 0) << dialogue.name;
    for (size_t i = 0; i < dialogue.steps.size(); ++i) {
      const Step& step = dialogue.steps[i];
      for (const Fault fault : with_handle ? faults_of_handles : faults) {
        if (!is_tried(dialogue, i, with_handle, fault)) continue;
        const char sign = static_cast<char>(fault);
        SCOPED_TRACE(std::string(dialogue.name) + ": " + step.said + " with fault " + sign);
        const std::string survived =
            with_handle ? "gs" + std::string(step.handled) : std::string(step.survived);
        EXPECT_EQ(copy_against(dialogue, with_handle, fault, i, folder),
                  survived.find(sign) != std::string::npos ? 0 : dialogue.network_failed());
      }
    }
    EXPECT_EQ(open_handles(), handles) << dialogue.name;
  }
}

TEST(FaultMatrix, OfACopy) {
  check_matrix(false);
}

TEST(FaultMatrix, OfAHandle) {
  check_matrix(true);
}

}  // namespace
