/* The units beside this one each include one public header; that they compile and link is the test. */
int main(void) { return 0; }
