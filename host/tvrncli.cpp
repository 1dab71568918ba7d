// tvrncli: command-line client over the embedded CMPI host (see host/cli.h).
#include "host/classinfo.h"
#include "host/cli.h"

int main(int argc, char** argv) {
    return tvrnhost::cli::main(argc, argv, &tvrnhost::classinfo::moduleCatalog());
}
