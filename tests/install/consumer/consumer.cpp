#include <ingester/ingester.h>

#include <iostream>

int main()
{
    const std::int32_t returned = INGESTER("", "", 0, 0);
    std::cout << "C++: INGESTER returned " << returned << '\n';
    return returned == INGESTER_SUCCESS ? 0 : 1;
}
