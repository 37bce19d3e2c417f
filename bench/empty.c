/* empty.c: the least that a program can cost. */
int main(void) {
    return 0;
}
