# The same as transfer_attended.sh where media are relayed: who are joined keep the sessions that they have.
RELAYED="o=gateway"
. "$(dirname "$0")/transfer_attended.sh"
