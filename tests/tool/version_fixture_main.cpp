// A program that does nothing: the version reader's tests look at its file.
int main() { return 0; }
