/* Edits a list of recent documents: the newest first, none of them twice, five at most. */
#include <stdio.h>
#include <string.h>
#include <zarvo.h>

enum { MOST = 5 };

/* A file that is not there yet is an empty list. Gives the number of entries; -1 when there is no
   memory or the file cannot be read. */
static int read_list(const char* path, char*** list) {
  char line[ZV_PATH_MAX + 2]; /* with its CR and LF */
  int n = zv_strlist(list, NULL, 0);
  FILE* const file = zv_fopen(path, "r", NULL);
  if (file == NULL) return zv_access(path, 0) == 0 ? -1 : n;
  while (n >= 0 && zv_fgets(line, sizeof line, file, 1) != NULL)
    if (zv_strtrim(line) > 0) n = zv_strlist_insert(list, n, -1, line) ? n + 1 : -1;
  if (ferror(file)) n = -1;
  zv_fclose(file);
  return n;
}

static int put_first(char*** list, int n, const char* document) {
  const int known = zv_strlist_iidx(*list, n, document);
  if (known >= 0) zv_free(zv_strlist_remove(*list, n--, known));
  if (!zv_strlist_insert(list, n, 0, document)) return -1;
  for (++n; n > MOST; --n) zv_free(zv_strlist_remove(*list, n, MOST));
  return n;
}

/* zv_fclose() does not tell whether the last bytes could be written: fflush() does. */
static int write_list(const char* path, char** list) {
  FILE* const file = zv_fopen(path, "w", NULL);
  int good = file != NULL;
  for (; good && *list != NULL; ++list)
    good = zv_fputs(*list, file, 0) == 0 && zv_fputs("\n", file, 0) == 0;
  good = good && fflush(file) == 0;
  zv_fclose(file);
  return good;
}

int main(int argc, char** argv) {
  char** list = NULL;
  int n, good;
  if (argc != 3 || strlen(argv[2]) >= ZV_PATH_MAX) {
    fprintf(stderr, "usage: recent LIST DOCUMENT\n");
    return 2;
  }
  n = read_list(argv[1], &list);
  if (n >= 0) n = put_first(&list, n, argv[2]);
  good = n >= 0 && write_list(argv[1], list);
  if (!good) fprintf(stderr, "recent: cannot keep %s in %s\n", argv[2], argv[1]);
  for (int i = 0; good && i < n; ++i) puts(list[i]);
  zv_strlist_free(list, -1);
  return good ? 0 : 1;
}
