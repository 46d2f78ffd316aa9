/* Signs a user on through the C interface.
 *   interface SERVER LOGIN PASSWORD */
#include <qvsa.h>
#include <stdio.h>

int main(int argc, char** argv) {
  qvsa_value user, result, text, place[2], arguments[3];
  int signed_on = 0;
  if (argc != 4) return 2;

  place[0] = qvsa_text(argv[1]);
  place[1] = qvsa_text("QVApp");
  arguments[0] = qvsa_text(argv[2]);
  arguments[1] = qvsa_text(argv[3]);
  arguments[2] = qvsa_empty(); /* the session id comes back here */
  if (qvsa_create("User", &user) < 0 || qvsa_call(user.as.object, "connect", place, 2, NULL) < 0 ||
      qvsa_call(user.as.object, "loginAuth", arguments, 3, &result) < 0) {
    fprintf(stderr, "%s\n", qvsa_error_text()); /* a call that could not be made */
    return 1;
  }
  signed_on = result.as.boolean && arguments[2].as.text.length > 0;
  if (qvsa_get(user.as.object, signed_on ? "Name" : "errDescription", &text) == QVSA_OK)
    printf("%s\n", text.as.text.data);
  qvsa_release(&text);
  qvsa_release(&arguments[2]);
  qvsa_release(&user);
  return signed_on ? 0 : 1;
}
