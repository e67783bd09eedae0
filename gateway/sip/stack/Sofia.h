#pragma once

/// The SIP stack's headers, with our classes as the arguments that it hands back to its callbacks. Every file of the
/// SIP module includes the stack through here, so that all of them agree.
class SipDescriptorHandler;
class SipEndpoint;
class SipInterface;
class SipRequestHandler;

#define NTA_AGENT_MAGIC_T SipInterface
#define NTA_LEG_MAGIC_T SipRequestHandler
#define NTA_OUTGOING_MAGIC_T SipEndpoint
#define NTA_INCOMING_MAGIC_T SipEndpoint
#define NTA_RELIABLE_MAGIC_T SipEndpoint
#define SU_WAKEUP_ARG_T SipDescriptorHandler

#include <sofia-sip/msg_addr.h>
#include <sofia-sip/msg_header.h>
#include <sofia-sip/nta.h>
#include <sofia-sip/nta_stateless.h>
#include <sofia-sip/nta_tag.h>
#include <sofia-sip/nta_tport.h>
#include <sofia-sip/sip_header.h>
#include <sofia-sip/sip_parser.h>
#include <sofia-sip/sip_protos.h>
#include <sofia-sip/sip_status.h>
#include <sofia-sip/sip_tag.h>
#include <sofia-sip/sresolv.h>
#include <sofia-sip/su_log.h>
#include <sofia-sip/su_wait.h>
#include <sofia-sip/tport.h>
#include <sofia-sip/tport_tag.h>
