/* A plugin host: shows every picture in a folder with whatever plugins there are.

       gallery PLUGINS PICTURES SHEET.png

   Lists each picture with its format, its size and its average colour, and writes a contact sheet
   of all of them. The gallery itself knows no picture format: it finds the plugins of the API
   "img", matches each file to one by its name, and loads the plugin only while it reads the file.
 */
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <zarvo.h>

#include "img.h"
#include "png.h"
#include "sheet.h"

/* Tries every img_*.dll in the folder, which the library reports on standard error. The 0 at the
   end unloads each again: what is kept is its record, with the formats that it reads. */
static zv_plugin_t** find_plugins(const char* folder) {
  zv_plugin_t** plugins = NULL;
  zv_putenv_private(IMG_API, folder, 0);
  zv_plugin_enumerate(&plugins, IMG_API, IMG_OLDEST, IMG_NEWEST, 0);
  return plugins;
}

static void give_back(zv_plugin_t** plugins) {
  zv_plugin_t** plugin;
  for (plugin = plugins; plugin != NULL && *plugin != NULL; ++plugin) zv_plugin_destroy(*plugin);
  zv_free(plugins);
}

static int select_entry(const char* dir, const char* name, void* selection) {
  return zv_dir_select(dir, name, (const dirsel_t*)selection);
}

static int compare_entries(const void* a, const void* b) {
  return zv_strlist_cmp((const char**)a, (const char**)b);
}

/* The paths of all visible files in a folder, in the order of their names; NULL for no memory. */
static char** find_files(const char* folder, int* count) {
  dirsel_t all_files = {NULL, "*", NULL, 0, 0};
  char** files = NULL;
  *count = zv_dir_scan(folder, &files, select_entry, &all_files, 1, 0);
  if (files != NULL) qsort(files, (size_t)*count, sizeof *files, compare_entries);
  return files;
}

/* Loads the plugin for as long as it reads one picture. */
static int read_picture(zv_plugin_t* plugin, const char* path, img_picture_t* picture) {
  int read = 0;
  if (zv_plugin_load(plugin)) {
    const img_api_t* const img = (const img_api_t*)plugin->plugin->api_entry;
    read = img->read(path, picture);
    zv_plugin_unload(plugin);
  }
  return read;
}

static void print_picture(const zv_plugin_t* plugin, const img_picture_t* picture) {
  unsigned char rgb[3];
  average_colour(picture, rgb);
  /* A format entry begins with its description, which a | ends. */
  printf("%-16.*s %5d x %-5d #%02x%02x%02x\n", (int)strcspn(plugin->formats[0], "|"),
         plugin->formats[0], picture->width, picture->height, rgb[0], rgb[1], rgb[2]);
}

static void show_file(zv_plugin_t** plugins, const char* path, img_picture_t* sheet, int cell) {
  img_picture_t picture = {0, 0, NULL};
  zv_plugin_t* const plugin = plugins == NULL ? NULL : zv_plugin_get_entry_by_fmt(plugins, path);
  char name[ZV_PATH_MAX];
  zv_extract_filename(path, name, sizeof name);
  printf("%-20s ", name);
  if (plugin == NULL) {
    printf("no plugin\n");
    cross_out(sheet, cell);
  } else if (!read_picture(plugin, path, &picture)) {
    printf("not readable\n");
    cross_out(sheet, cell);
  } else {
    print_picture(plugin, &picture);
    place_picture(sheet, cell, &picture);
    zv_free(picture.rgb);
  }
}

static int show_folder(zv_plugin_t** plugins, const char* folder, const char* sheet_path) {
  img_picture_t sheet;
  int count, i, written;
  char** const files = find_files(folder, &count);
  if (files == NULL || !make_sheet(&sheet, count)) {
    zv_strlist_free(files, -1);
    return 0;
  }
  for (i = 0; i < count; ++i) show_file(plugins, files[i], &sheet, i);
  written = write_png(sheet_path, &sheet);
  zv_free(sheet.rgb);
  zv_strlist_free(files, -1);
  return written;
}

int main(int argc, char** argv) {
  zv_plugin_t** plugins;
  int shown;
  if (argc != 4) {
    fprintf(stderr, "usage: gallery PLUGINS PICTURES SHEET.png\n");
    return 2;
  }
  plugins = find_plugins(argv[1]);
  shown = show_folder(plugins, argv[2], argv[3]);
  give_back(plugins);
  if (!shown) fprintf(stderr, "gallery: cannot write %s\n", argv[3]);
  return shown ? 0 : 1;
}
