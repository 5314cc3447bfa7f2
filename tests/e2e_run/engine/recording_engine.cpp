// Stands in for the engine program in end-to-end tests: writes its arguments (one a line) to
// $VELMORA_TEST_RECORD/args.txt, copies the setup file it got to $VELMORA_TEST_RECORD/setup-copy.wpx
// and exits with $VELMORA_TEST_EXIT (0 when unset).
#include <cstdlib>
#include <fstream>
#include <string>

int main(int argc, char** argv)
{
    if (const char* folder = std::getenv("VELMORA_TEST_RECORD"); folder && *folder) {
        std::ofstream args(std::string(folder) + "/args.txt");
        for (int i = 1; i < argc; ++i)
            args << argv[i] << '\n';
        if (argc > 1) {
            std::ifstream setup(argv[1], std::ios::binary);
            std::ofstream copy(std::string(folder) + "/setup-copy.wpx", std::ios::binary);
            copy << setup.rdbuf();
        }
    }
    const char* status = std::getenv("VELMORA_TEST_EXIT");
    return status ? std::atoi(status) : 0;
}
