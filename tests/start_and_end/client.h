// Calls a bit of everything; ends the program with 1 when something does not hold.
#pragma once

__attribute__((visibility("default"))) void useEverything(const char* when);
