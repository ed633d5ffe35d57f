#include "hostsvc/msg_t.h"

#include <cstdlib>
#include <iostream>
#include <sstream>

void free_msg(msg_t& m) {
    std::free(m.data);
    std::free(m.ex_data);
}

void print_msg(const char* title, const msg_t& m) {
    std::cout << "----------------" << std::endl
              << "** " << title << " **" << std::endl
              << "   type = " << m.type << std::endl
              << "   tran = " << m.tran << std::endl
              << "   size = " << m.size << std::endl
              << "ex_size = " << m.ex_size << std::endl
              << "----------------" << std::endl;
}

void byte_print_msg(const char* buf, int n) {
    std::ostringstream line;
    line << std::hex;
    for (int i = 0; i < n; ++i)
        line << "0x" << int{static_cast<signed char>(buf[i])} << ' ';
    std::cout << line.str() << std::endl;
}
