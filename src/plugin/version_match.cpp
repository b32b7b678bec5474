// The version that a plugin and its host agree on.
#include <algorithm>

#include "zarvo.h"

int zv_plugin_match_vers(int min, int max, int oldest, int newest, int* version) {
  if (max < oldest) {
    *version = oldest;
    return 0;
  }
  *version = std::min(max, newest);
  return max <= newest || newest >= min;
}
