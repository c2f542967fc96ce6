// Process entry of the CGI library (being written).
#include "platform/cgic.h"



int main()
{
    cgiOut = stdout;
    return cgiMain();
}
