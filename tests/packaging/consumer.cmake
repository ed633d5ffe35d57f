# A project of somebody else's, which has the installed package and nothing of this tree.
cmake_minimum_required(VERSION 3.25)
project(consumer LANGUAGES CXX)
find_package(vela 1.1 REQUIRED)
add_executable(consumer vela_example.cc)
target_link_libraries(consumer PRIVATE vela::vela vela::norv)
