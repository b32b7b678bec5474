/* Finds the plugin that reads a file: asks each library of a folder, then goes by the file's name.
 */
#include <stdio.h>
#include <string.h>
#include <zarvo.h>

static void give_back(zv_plugin_t** plugins) {
  for (zv_plugin_t** plugin = plugins; plugin != NULL && *plugin != NULL; ++plugin)
    zv_plugin_destroy(*plugin);
  zv_free(plugins);
}

/* The plugin is loaded from here on, and its functions lie behind `api_entry`. */
static int use(zv_plugin_t* plugin) {
  if (!zv_plugin_load(plugin)) {
    fprintf(stderr, "find_plugin: %s cannot be loaded any more\n", plugin->lib);
    return 0;
  }
  printf("%s, version %d: %.*s\n", plugin->lib, plugin->version,
         (int)strcspn(plugin->formats[0], "|"), plugin->formats[0]); /* its description */
  zv_plugin_unload(plugin);
  return 1;
}

int main(int argc, char** argv) {
  zv_plugin_t** plugins = NULL;
  zv_plugin_t* plugin = NULL;
  int used = 0;
  if (argc != 3) {
    fprintf(stderr, "usage: find_plugin FOLDER FILE\n");
    return 2;
  }
  /* Plugins of the API "img" are img_*.dll in the folder that this variable names. Each is reported
     on standard error, and unloaded again: its record keeps what it told of its formats. */
  if (zv_putenv_private("img", argv[1], 0)) zv_plugin_enumerate(&plugins, "img", 1, 5, 0);
  if (plugins != NULL) plugin = zv_plugin_get_entry_by_fmt(plugins, argv[2]);
  if (plugin == NULL)
    fprintf(stderr, "find_plugin: no plugin in %s reads %s\n", argv[1], argv[2]);
  else
    used = use(plugin);
  give_back(plugins);
  return used ? 0 : 1;
}
