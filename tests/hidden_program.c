/* The hidden attribute for hidden_across.sh: `zarvo_hidden PATH` prints 1 when PATH is hidden, else
   0; `zarvo_hidden PATH 0|1` clears or sets it, and fails when it cannot. */
#include <stdio.h>
#include <stdlib.h>
#include <zarvo.h>

int main(int argc, char** argv) {
  if (argc == 2) return printf("%d\n", zv_get_hidden(argv[1])) < 0;
  return argc != 3 || zv_set_hidden(argv[1], atoi(argv[2])) == 0;
}
