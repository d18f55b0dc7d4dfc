// kxserverd: the telephony service that owns one baseband source and serves log channels to monitors.
#include "service/ServiceMain.h"

int main(int argc, char** argv) {
    return velmar::runKxServerd(argc, argv);
}
