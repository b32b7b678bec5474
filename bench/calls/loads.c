/* A program that is only loaded: together with whatever it is linked with. */
int main(void) {
  return 0;
}
