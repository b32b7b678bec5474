// Memory that runs out when a test wants it to. Only for zarvo_internal_tests, whose calls of
// malloc(), calloc() and realloc() the linker leads through here.
#ifndef ZARVO_TESTS_FAILING_ALLOCATION_H
#define ZARVO_TESTS_FAILING_ALLOCATION_H

// While it lives, one allocation fails: the first, or the one after `skipped`
// others.
class FailingAllocation {
 public:
  explicit FailingAllocation(int skipped);
  ~FailingAllocation();
  FailingAllocation(const FailingAllocation&) = delete;
  FailingAllocation& operator=(const FailingAllocation&) = delete;

  bool happened() const;
};

// Runs `attempt` again and again, each time with a later allocation failing, until none does; after
// each run that met a failure, `check` looks at what it left. Gives the number of failures met.
template <class Attempt, class Check>
int fail_each_allocation(Attempt attempt, Check check) {
  for (int skipped = 0;; ++skipped) {
    bool happened = false;
    {
      const FailingAllocation failing(skipped);
      attempt();
      happened = failing.happened();
    }
    if (!happened) return skipped;
    check();
  }
}

#endif
