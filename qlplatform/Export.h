// The one export macro of both libraries.
#pragma once

/// Marks a name that belongs to the interface of libqlplatform or libqltypes; everything else is hidden.
#define QL_EXPORT __attribute__((visibility("default")))
