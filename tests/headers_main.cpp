// Compiles the tests' common headers, for all of them.
int main() {
    return 0;
}
