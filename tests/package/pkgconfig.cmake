# Builds SOURCE as a stranger would who has a compiler and pkg-config, against what is installed in TREE, and runs it.
cmake_minimum_required(VERSION 3.25)

set(ENV{PKG_CONFIG_PATH} ${TREE}/${LIBRARY_DIRECTORY}/pkgconfig)
execute_process(COMMAND ${PKG_CONFIG} --cflags --libs mcobnqrt OUTPUT_VARIABLE packageFlags COMMAND_ERROR_IS_FATAL ANY)
separate_arguments(packageFlags UNIX_COMMAND "${packageFlags}")
separate_arguments(FLAGS UNIX_COMMAND "${FLAGS}")
execute_process(COMMAND ${COMPILER} -std=c++17 ${FLAGS} ${SOURCE} ${packageFlags} -o ${PROGRAM}
                COMMAND_ERROR_IS_FATAL ANY)

set(ENV{LD_LIBRARY_PATH} ${TREE}/${LIBRARY_DIRECTORY})
execute_process(COMMAND ${PROGRAM} COMMAND_ERROR_IS_FATAL ANY)
