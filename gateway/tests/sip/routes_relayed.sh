# The same as routes.sh where media are relayed: the next route has the ports of the one before.
RELAYED="o=gateway"
. "$(dirname "$0")/routes.sh"
