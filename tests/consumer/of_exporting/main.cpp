// A program that uses a library that uses this one.

#include <rings.h>

#include <iostream>

int main() { std::cout << ring(1, 2).elements.size() << " elements"; }
