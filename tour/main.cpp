#include <cstdio>
#include <fstream>
#include <string>

#include "QuoteServer.h"
#include "Tour.h"
#include "app/NorvelApp.h"

// quorvan-tour FOLDER PICTURES: works the program that lies in FOLDER, which must be a new one with the
// sample portfolios, and saves pictures in PICTURES. Exit status: 0 when everything was as it should be,
// else 1.
int main(int argc, char** argv) {
    if (argc != 3) {
        std::fprintf(stderr, "usage: quorvan-tour FOLDER PICTURES\n");
        return 1;
    }
    const std::string folder = argv[1];
    BApplication::SetExecutablePath((folder + "/quorvan").c_str());
    QuoteServer quotes(folder + "/invest.db");
    std::ofstream(folder + "/Quorvan.cfg") << quotes.SourceLine();
    Tour tour(folder, argv[2], quotes);
    {
        NorvelApp application;
        application.Run();
    }
    return tour.Failed() ? 1 : 0;
}
