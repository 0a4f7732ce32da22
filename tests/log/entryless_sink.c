/* A library that is no sink. */
int NotALog(void);

int NotALog(void) {
    return 1;
}
