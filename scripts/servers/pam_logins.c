/* Checks vsftpd's logins without a change to the machine. Preloaded, it lets services be described
 * in the folder PAM_FOLDER; as the module named there it takes the logins given as its arguments,
 * "user password" each. Declared here because the PAM headers need not be installed. */
#include <stdlib.h>
#include <string.h>

enum { PAM_SUCCESS = 0, PAM_AUTH_ERR = 7, PAM_AUTHTOK = 6 };

int pam_start_confdir(const char* service, const char* user, const void* conversation,
                      const char* folder, void** handle);
int pam_get_user(void* handle, const char** user, const char* prompt);
int pam_get_authtok(void* handle, int item, const char** token, const char* prompt);

int pam_start(const char* service, const char* user, const void* conversation, void** handle) {
  return pam_start_confdir(service, user, conversation, getenv("PAM_FOLDER"), handle);
}

int pam_sm_authenticate(void* handle, int flags, int argc, const char** argv) {
  const char* user = NULL;
  const char* password = NULL;
  (void)flags;
  if (pam_get_user(handle, &user, NULL) != PAM_SUCCESS) return PAM_AUTH_ERR;
  if (pam_get_authtok(handle, PAM_AUTHTOK, &password, NULL) != PAM_SUCCESS) return PAM_AUTH_ERR;
  for (int i = 0; i + 1 < argc; i += 2)
    if (strcmp(user, argv[i]) == 0 && strcmp(password, argv[i + 1]) == 0) return PAM_SUCCESS;
  return PAM_AUTH_ERR;
}

int pam_sm_setcred(void* handle, int flags, int argc, const char** argv) {
  (void)handle, (void)flags, (void)argc, (void)argv;
  return PAM_SUCCESS;
}

int pam_sm_acct_mgmt(void* handle, int flags, int argc, const char** argv) {
  return pam_sm_setcred(handle, flags, argc, argv);
}
