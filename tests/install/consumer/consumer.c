#include <ingester/ingester.h>

#include <stdio.h>

int main(void)
{
    const int32_t returned = INGESTER("", "", 0, 0);
    printf("C: INGESTER returned %d\n", (int)returned);
    return returned == INGESTER_SUCCESS ? 0 : 1;
}
