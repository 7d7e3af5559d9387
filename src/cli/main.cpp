#include <iostream>

int main() {
    std::cout << "rcvrchar\n";
    return 0;
}
