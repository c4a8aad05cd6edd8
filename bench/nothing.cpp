// bench_nothing: the cost of starting a statically linked program that does
// nothing, the reference for the fixed cost of a small run.
int main() { return 0; }
