# The services of systemd. The lines that all of them share are in hardening.conf.
file(READ systemd/hardening.conf HARDENING)
string(STRIP "${HARDENING}" HARDENING)
set(lapdmon_units lapdmon@.service lapdmon@.socket lapdmon-record@.service kv9relayd.service)
set(fleet_units lapdship.service lapdstore.service lapdstore-forget.service lapdstore-forget.timer)
foreach(unit ${lapdmon_units} ${fleet_units})
    file(READ systemd/${unit} text)
    string(REPLACE "@HARDENING@" "${HARDENING}" text "${text}")
    file(CONFIGURE OUTPUT units/${unit} CONTENT "${text}" @ONLY)
endforeach()
foreach(package lapdmon fleet)
    list(TRANSFORM ${package}_units PREPEND ${CMAKE_CURRENT_BINARY_DIR}/units/)
    install(FILES ${${package}_units} DESTINATION lib/systemd/system COMPONENT ${package})
endforeach()
install(PROGRAMS systemd/lapdmon-trace DESTINATION lib/lapdmon COMPONENT lapdmon)

# What whoever runs a fleet begins with.
install(FILES fleet/lapdship.toml fleet/lapdstore.default fleet/lapdstore-forget.default prometheus/alerts.yml
    prometheus/prometheus.yml prometheus/alertmanager.yml DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/lapdmon-fleet/examples COMPONENT fleet)
install(PROGRAMS ${PROJECT_SOURCE_DIR}/scripts/fleet-certificates
    DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/lapdmon-fleet/examples COMPONENT fleet)
