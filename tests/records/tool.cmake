# The tool from its command line: what it prints and how it ends.

# run(status arguments...): runs the tool, which must end with that status; leaves `output` and `error`.
macro(run status)
    execute_process(COMMAND ${RECORDS} ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE output ERROR_VARIABLE error)
    if(NOT result STREQUAL "${status}")
        message(FATAL_ERROR "records ${ARGN}: status ${result} rather than ${status}\n${output}${error}")
    endif()
endmacro()

function(expect what actual expected)
    if(NOT actual STREQUAL expected)
        message(FATAL_ERROR "${what}: \"${actual}\" rather than \"${expected}\"")
    endif()
endfunction()

run(0 decode Charge A315A110A10E8103455552A207810204D2820101820101)
expect("a charge" "${output}" "value: Charge ::= specific : { recorded currency : { rCurrency \"EUR\", rAmount { currencyAmount 1234, multiplier oneHundredth } }, typeOfChargingInfo total }
text: EUR 12.34 (total)
DER: A315A110A10E8103455552A207810204D2820101820101
")
run(0 decode Tariff 02820002007f)
expect("not the shortest form" "${output}" "value: Tariff ::= specialArrInfo : 127
text: Special Arrangement 127
DER: 02017F
")
run(0 decode QoS 300B8101008202015EA3028200)
expect("a tree" "${output}" "value: CC-QoS ::= { voiceQuality 0, meanOpinionScore 350, mediaInfo ds0 : NULL }
text:
    MOS:                                 3.50
    Media:                               DS0
DER: 300B8101008202015EA3028200
")
run(0 decode Scale 0A0109)
expect("no record, and no name" "${output}" "value: Scale ::= 9\nDER: 0A0109\n")
run(0 notation SpecialChargingCode)
expect("a definition" "${output}" "SpecialChargingCode ::= INTEGER (1..10)\n")
run(0 types)
if(NOT output MATCHES "^Currency\n.*\nCharge\n.*\nStat\n$")
    message(FATAL_ERROR "types: ${output}")
endif()
run(0 --help)

run(1 decode Amount 3003810105)
expect("a bad value" "${output}${error}" "records: Amount.multiplier: is missing, octet 5\n")
foreach(hex IN ITEMS 8 8G0 81000 "81 00" 0x8100)
    run(2 decode Charge ${hex})
    expect("bad hexadecimal ${hex}" "${output}${error}" "records: the octets must be pairs of hexadecimal digits\n")
endforeach()
run(2 decode Price 8100)
expect("an unknown type" "${output}${error}" "records: there is no type \"Price\"\n")
run(2 notation Price)
expect("an unknown type" "${output}${error}" "records: there is no type \"Price\"\n")
run(2)
run(2 decode Charge)
run(2 decode Charge 8100 8100)
run(2 price)

file(WRITE ${WORK}/good.txt "# a comment\n\nfree | Charge ::= freeOfCharge : NULL | 8200\r\n")
run(0 check ${WORK}/good.txt)
expect("good examples" "${output}${error}" "1 passed, 0 failed\n")
file(WRITE ${WORK}/bad.txt "free | Charge ::= freeOfCharge : NULL | 8200\nwrong | Charge ::= freeOfCharge : NULL | 8100\nhalf | Charge ::=")
run(1 check ${WORK}/bad.txt)
expect("bad examples" "${output}${error}" "wrong: decodes to chargeNotAvailable : NULL
half: is not \"name | Type ::= value | DER\"
1 passed, 2 failed
")
run(2 check ${WORK}/nowhere.txt)
expect("no file" "${output}${error}" "records: cannot read ${WORK}/nowhere.txt\n")
run(2 check ${WORK})
expect("a folder" "${output}${error}" "records: cannot read ${WORK}\n")
