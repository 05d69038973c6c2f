// The program of one fuzzer: the engine calls these with the texts it makes up.

#include <clocale>
#include <cstdint>
#include <cstdio>
#include <cstdlib>

#include "LDIF_Exception.h"
#include "property.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    setlocale(LC_ALL, "");
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    try {
        CFG32_PROPERTY({reinterpret_cast<const char*>(data), size});
        return 0;
    } catch (const LDIF_Exception& e) {
        fprintf(stderr, "%s\n", e.dump().c_str());
    } catch (const std::exception& e) {
        fprintf(stderr, "%s\n", e.what());
    }
    abort();
}
