// A program that links to a library that links to this one.

#include <rings.h>

#include <iostream>

int main() { std::cout << ring(1, 2).elements.size() << " elements"; }
