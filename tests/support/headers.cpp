// Only carries the precompiled headers of all tests.
int main() {}
