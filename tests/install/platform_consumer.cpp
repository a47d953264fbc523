// A client of the platform library alone.
#include "qlplatform/memory/Memory.h"

int main() {
    utFree(utCalloc(2, 8));
    return 0;
}
