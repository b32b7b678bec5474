#include "failures/table.h"

#include <algorithm>
#include <cstdio>

namespace failing {

namespace {

bool allows(const Row& row, size_t failure, int result) {
  if (row.in_any_order)
    return std::find(row.results.begin(), row.results.end(), result) != row.results.end();
  return result == row.results.at(std::min(failure, row.results.size() - 1));
}

// Each row must meet a failure, where the linker has replaced the call at all.
int walk_row(const Row& row) {
  SCOPED_TRACE(row.operation.name);
  size_t failure = 0;
  return walk(row.fault, [&](Attempt& attempt) {
    const int result = row.operation.run(attempt);
    if (attempt.failed().empty()) {
      EXPECT_EQ(result, row.operation.good);
    } else {
      EXPECT_TRUE(allows(row, failure++, result)) << attempt.failed() << " gave " << result;
    }
  });
}

}  // namespace

void walk_all(const char* what, const std::vector<Row>& rows) {
  int points = 0;
  for (const Row& row : rows) {
    const int met = walk_row(row);
    EXPECT_GT(met, 0) << row.operation.name << ": " << row.fault.call << " was never called";
    points += met;
  }
  std::printf("%s: %d points of %zu rows\n", what, points, rows.size());
}

}  // namespace failing
