// Prints the reference table of docs/dialect.md.

#include <iostream>

#include "providers/tsql/Dialect.h"

int main() { std::cout << QVSa::tsql::dialectReference(); }
