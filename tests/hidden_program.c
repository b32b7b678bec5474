/* The hidden attribute from the command line, for hidden_across.sh.
 *   zarvo_hidden PATH        prints 1 when PATH is hidden, else 0
 *   zarvo_hidden PATH 0|1    clears or sets the attribute, and fails when it cannot
 */
#include <stdio.h>
#include <stdlib.h>

#include "zarvo.h"

int main(int argc, char** argv) {
  if (argc == 2) return printf("%d\n", zv_get_hidden(argv[1])) < 0;
  if (argc == 3) return zv_set_hidden(argv[1], atoi(argv[2])) == 0;
  fputs("usage: zarvo_hidden PATH [0|1]\n", stderr);
  return 2;
}
