cmake_minimum_required(VERSION 3.16)

# Every product and sum of the library is rounded on its own. Compilers fuse
# a*b+c behind the flags' back in some patterns (g++ 12 with AVX-512 does so
# for add/subtract pairs of products), so the disassembly is searched for
# fused instructions. Only the matrix product, which goes through Eigen and
# is not promised bit for bit across builds, may hold them.
execute_process(COMMAND ${OBJDUMP} -d -C --no-show-raw-insn ${LIBRARY}
    OUTPUT_VARIABLE listing RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
    message(FATAL_ERROR "objdump failed on ${LIBRARY}")
endif()
string(REPLACE "\n" ";" lines "${listing}")
set(function "")
set(bad "")
foreach(line IN LISTS lines)
    if(line MATCHES "^[0-9a-f]+ <(.*)>:$")
        set(function "${CMAKE_MATCH_1}")
    elseif(line MATCHES "\t(${FUSED})[ \t]" AND NOT function MATCHES "Eigen|MultiplyMapped")
        list(APPEND bad "${function}")
    endif()
endforeach()
if(bad)
    list(REMOVE_DUPLICATES bad)
    list(JOIN bad "\n  " text)
    message(FATAL_ERROR "fused multiply-add instructions in:\n  ${text}")
endif()
message(STATUS "no fused multiply-add outside the matrix product")
