# Installs BUILD into TREE, where nothing is left of an earlier time.
cmake_minimum_required(VERSION 3.25)

file(REMOVE_RECURSE ${TREE})
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${TREE} COMMAND_ERROR_IS_FATAL ANY)
