# Builds for tests compile eight sources at a time (CMAKE_UNITY_BUILD in CMakePresets.json), which takes a third of the
# time. What the preprocessor and anonymous namespaces keep apart otherwise meets then, so a source whose own names are
# those of another one in its target is compiled alone. A new one is to have names of its own, or to be named here.
function(compiled_alone target)
    if(TARGET ${target})
        get_target_property(folder ${target} SOURCE_DIR)
        list(TRANSFORM ARGN PREPEND ${folder}/)
        set_source_files_properties(${ARGN} TARGET_DIRECTORY ${target} PROPERTIES SKIP_UNITY_BUILD_INCLUSION ON)
    endif()
endfunction()

set(platform platform/media/MG_Rtp.cpp platform/media/MG_Tones.cpp platform/media/VoipCodecAndMode.cpp)
foreach(class InformationTransferCapability NumberingPlan PresentationIndicator ReasonForRedirection ScreeningIndicator TypeOfNumber)
    list(APPEND platform platform/signalling/Q${class}.cpp)
    list(APPEND signalling_tests Q${class}_test.cpp)
endforeach()
compiled_alone(ccplatform ${platform})
compiled_alone(callcontrol
    adapters/CC_CallAdapter_Dial.cpp adapters/CC_CallAdapter_Properties.cpp callcontrol/CC_CallPool.cpp calls/CC_Call.cpp
    calls/CC_CallLeg.cpp properties/CC_PropertyContainerContainer.cpp properties/CC_PropertyFilterContainer.cpp)
compiled_alone(callcontrol-diagnosis diagnosis/CC_RecordingReport.cpp)
compiled_alone(platform_base_test TYPtr_test.cpp)
compiled_alone(platform_eventloop_test TYEventLoop_test.cpp TYTimer_test.cpp)
compiled_alone(platform_signalling_test ${signalling_tests})
compiled_alone(platform_media_test VoipCodecList_test.cpp)
compiled_alone(properties_test
    CC_PropertyCallLegState_test.cpp CC_PropertyName_test.cpp CC_PropertyTable_test.cpp CC_PropertyWaitForMessage_test.cpp
    CC_PropertyWorkingCopy_test.cpp)
compiled_alone(callcontrol-testing-main ReplacedNew.cpp)
compiled_alone(calls_test CC_CallLeg_test.cpp)
compiled_alone(callcontrol_test CC_Context_Info_test.cpp)
compiled_alone(adapters_test CC_CallAdapter_FollowingFilters_test.cpp CC_CallAdapter_Log_test.cpp)
compiled_alone(records_test SecondCodec_test.cpp)
compiled_alone(callcontrol-simulation Model_Adapter.cpp Model_Operations.cpp Values.cpp)
compiled_alone(gateway-media rtp/RtcpPacket.cpp rtp/RtpNumbering.cpp rtp/RtpTermination.cpp srtp/SrtpSession.cpp)
compiled_alone(gateway-sip-parts
    access/SipNonces.cpp access/SipSender.cpp
    message/SipCodec.cpp message/SipDigits.cpp message/SipNameAddr.cpp message/SipParty.cpp message/SipQuality.cpp)
compiled_alone(gateway-host operation/record/CallWatch.cpp)
compiled_alone(gateway-isdn-parts endpoint/IsdnEndpoint_Calling.cpp endpoint/IsdnEndpoint_Services.cpp endpoint/IsdnInterface.cpp)
compiled_alone(gateway_test
    SipBody_test.cpp SipConfiguration_test.cpp SipDialogState_test.cpp SipDigits_test.cpp SipDiversion_test.cpp
    SipIdentity_test.cpp SipNonces_test.cpp SipParty_test.cpp SipQuality_test.cpp SipReason_test.cpp SipStream_test.cpp)
compiled_alone(media_test
    Quality_test.cpp Relay_test.cpp Rtcp_test.cpp Srtp_test.cpp TelephoneEvents_test.cpp Transcoding_test.cpp)
