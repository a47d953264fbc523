#include "tests/start_and_end/client.h"

int main() { useEverything("in main"); }
