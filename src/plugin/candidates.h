// The library files of a plugin folder that are worth trying.
#ifndef ZARVO_PLUGIN_CANDIDATES_H
#define ZARVO_PLUGIN_CANDIDATES_H

namespace zv {

// Takes from a list of `n` file names those that are a variant of another: its name with a `d`
// before the last dot, ignoring case. The others keep their order. Returns how many are left; -1,
// with the list as it was, when memory ran out.
int drop_variants(char** names, int n);

}  // namespace zv

#endif
