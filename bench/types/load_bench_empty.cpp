// A library with the dependencies of libqltypes and nothing in it.
