// The precompiled headers of the tests are compiled as those of this program.
int main() {}
