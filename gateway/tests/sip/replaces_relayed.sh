# The same as replaces.sh where media are relayed: the newcomer is answered by the gateway, and nobody is offered anything
# anew.
RELAYED="o=gateway"
. "$(dirname "$0")/replaces.sh"
