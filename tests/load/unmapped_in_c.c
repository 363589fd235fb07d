/* A program without the C++ library loads the provider and lets it go: nothing may keep it mapped.
 * The C++ library comes with the provider here, and must not have bound anything to it. */
#include <dlfcn.h>
#include <stdio.h>

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    for (int round = 0; round < 3; round++) {
        void* library = dlopen(argv[1], RTLD_NOW | RTLD_LOCAL);
        if (library == NULL) {
            fprintf(stderr, "%s\n", dlerror());
            return 2;
        }
        dlclose(library);
        if (dlopen(argv[1], RTLD_NOW | RTLD_NOLOAD) != NULL) {
            puts("still mapped");
            return 1;
        }
    }
    puts("unmapped each time");
    return 0;
}
