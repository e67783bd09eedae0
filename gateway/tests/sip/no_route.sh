# No route leads to the number: 404 with the cause, and nobody is called. The longest prefix decides.
. "$(dirname "$0")/../lib.bash"

caller() { send_invite; expect 404 Reason: "Q.850;cause=3;"; send_ack_of_failure; }

write_configuration '' '' 49
start_gateway
expect_caller caller 4420
expect_log "call 1 a refused: no route to '4420', cause 3 "
stop_gateway "1 calls placed, 0 answered, 0 cleared, 1 failed"
finish
