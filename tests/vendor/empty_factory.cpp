// A library whose factory exists and gives no instance interface.
extern "C" void* PlexorProvider_Create_InstanceMI(const void*, const void*, void*) {
    return nullptr;
}
