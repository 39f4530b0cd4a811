#include "app/Application.h"

int main(int argc, char** argv) {
    return pyx::runPyxon(argc, argv);
}
