// Explains a trouble code, with no car: explain CODE

#include <velmora/catalogue.h>
#include <velmora/error.h>

#include <iostream>

int main(int count, char** arguments)
{
    try {
        velmora::TroubleCode const code = velmora::explain(count > 1 ? arguments[1] : "P0420");
        for (velmora::TroubleCode::Meaning const& meaning : code.meanings) {
            std::cout << code.code << ' ' << meaning.maker << ": " << meaning.text << '\n';
        }
    } catch (velmora::Error const& error) {
        std::cerr << error << '\n';
        return static_cast<int>(error.kind());
    }
}
