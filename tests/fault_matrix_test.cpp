// Every reply of every dialogue, with every fault that a reply can have: each copy ends in the
// documented result, at once, with nothing left open.
#include <gtest/gtest.h>

#include <chrono>
#include <string>

#include "fixtures/dialogues.h"
#include "zarvo.h"

namespace {

using namespace scripted;

constexpr Fault faults[] = {Fault::wrong_code, Fault::cut_short, Fault::no_number, Fault::close,
                            Fault::reset,      Fault::bytewise,  Fault::with_next};

int copy_against(const Dialogue& dialogue, Fault fault, size_t step, const ScratchFolder& folder) {
  DialogueServer server(dialogue.steps, fault, step);
  const Route route(dialogue, server, folder);
  const auto begin = std::chrono::steady_clock::now();
  const int result = zv_copy(route.from.c_str(), route.to.c_str());
  // Far from a hang, even on a busy machine under Wine.
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
  EXPECT_TRUE(result != 0 || arrived(dialogue, server, folder));
  return result;
}

TEST(FaultMatrix, EveryReplyWithEveryFault) {
  const Network network;
  const ScratchFolder folder;
  folder.make_file("file", "hello");
  for (const Dialogue& dialogue : dialogues()) {
    const int handles = open_handles();
    EXPECT_EQ(copy_against(dialogue, Fault::none, 0, folder), 0) << dialogue.name;
    for (size_t step = 0; step < dialogue.steps.size(); ++step) {
      const auto& [heard, said, survived, before] = dialogue.steps[step];
      for (const Fault fault : faults) {
        if (said.empty() || survived == never_said) continue;
        if (heard == data_out && fault == Fault::with_next) continue;
        SCOPED_TRACE(std::string(dialogue.name) + ": " + said + " with fault " +
                     static_cast<char>(fault));
        const bool survives = survived.find(static_cast<char>(fault)) != std::string_view::npos;
        EXPECT_EQ(copy_against(dialogue, fault, step, folder),
                  survives ? 0 : dialogue.network_failed());
      }
    }
    EXPECT_EQ(open_handles(), handles) << dialogue.name;
  }
}

}  // namespace
