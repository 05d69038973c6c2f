// Runs the tests in the locale of the environment, as a program that calls cfg_init() runs.

#include <gmock/gmock.h>

#include <clocale>

int main(int argc, char** argv) {
    setlocale(LC_ALL, "");
    testing::InitGoogleMock(&argc, argv);
    return RUN_ALL_TESTS();
}
