-- The estimator knows the cars and writes both quotes.
UPDATE CAR SET MODEL_ID='C120', BODY_ID2='4S', ENG_SIZE='1.8' WHERE REGO='BRK204';
UPDATE CAR SET MODEL_ID='H210', BODY_ID2='4S', ENG_SIZE='3.8' WHERE REGO='TVL003';
UPDATE CUSTOMER SET street='27 Mill Lane', suburb='Wattlebridge 3999', PHONE_P='03 5550 0028', email='r.kestle@mail.example' WHERE NAME='Kestle';

UPDATE QUOTE1 SET QUOTER='Pat Ferrier', paint_rate=46, CAR_IN='@date+4@ 00:00:00', targetdate='@date+9@ 00:00:00', policy_no='ORL-8820' WHERE QTNNO='1029' AND Subquote=0;
UPDATE QUOTE1 SET QUOTER='Pat Ferrier', paint_rate=40, CAR_IN='@date+5@ 00:00:00', targetdate='@date+7@ 00:00:00' WHERE QTNNO='1030' AND Subquote=0;

INSERT INTO QUOTE2 (QTNNO, Subquote, category, script, rrhour, rahour, pthour, rr_rate2, opg_rate, qty, unitcost, PartNo, MARK, SIDE, VENDOR, blend, Tag, tosend, directbill, allow_tick, itemno) VALUES
    ('1029', 0, 'R&R', 'Front bumper cover', 1.2, 0, 0, 38, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '137'),
    ('1029', 0, 'R&R', 'L/H headlamp', 0.6, 0, 0, 38, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '138'),
    ('1029', 0, 'RA', 'L/H front guard', 0, 2.5, 0, 42, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '139'),
    ('1029', 0, 'RA', 'Bonnet, left edge', 0, 1.4, 0, 42, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '140'),
    ('1029', 0, 'PAINT', 'Front bumper cover', 0, 0, 2.2, 46, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '141'),
    ('1029', 0, 'PAINT', 'L/H front guard', 0, 0, 2, 46, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '142'),
    ('1029', 0, 'PAINT', 'Bonnet blend edge', 0, 0, 1.5, 46, 0, 0, 0, '', '', '', 0, 1, 1, '', '', 7, '143'),
    ('1029', 0, 'OPG', 'Paint materials, clear over base', 0, 0, 1.1, 46, 46, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '153'),
    ('1029', 0, 'PRT', 'Front bumper cover', 387.5, 0, 0, 0, 0, 1, 310, '52119-C1200', '', 'O', 1, 0, 1, '', '', NULL, '780'),
    ('1029', 0, 'PRT', 'L/H headlamp assembly', 306.25, 0, 0, 0, 0, 1, 245, '81170-C1210', '', 'L', 1, 0, 1, '', '', NULL, '781'),
    ('1029', 0, 'PRT', 'Bumper clips', 1.5, 0, 0, 0, 0, 8, 1.2, '90467-C07', '', 'O', 2, 0, 1, '', '', NULL, '782'),
    ('1029', 0, 'MIS', 'Environmental levy', 0, 0, 0, 0, 0, 0, 12.5, '', '', '', 0, 0, 1, '', '', NULL, '990'),
    ('1030', 0, 'R&R', 'Rear bumper cover', 1, 0, 0, 38, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '137'),
    ('1030', 0, 'R&R', 'R/H tail lamp', 0.4, 0, 0, 38, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '138'),
    ('1030', 0, 'RA', 'R/H rear quarter panel', 0, 3.2, 0, 42, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '139'),
    ('1030', 0, 'PAINT', 'R/H rear quarter panel', 0, 0, 2.4, 40, 0, 0, 0, '', '', '', 0, 0, 1, '', '', 7, '141'),
    ('1030', 0, 'PRT', 'R/H tail lamp', 135.7, 0, 0, 0, 0, 1, 118, '81550-H2110', 'U', 'R', 3, 0, 1, '', '', NULL, '780'),
    ('1030', 0, 'MIS', 'Four wheel alignment', 0, 0, 0, 0, 0, 0, 0, 'WHAL', '', '', 4, 0, 1, '', '', NULL, '990');

UPDATE QUOTE3 SET INCIDENT_NOTES='Left front impact, no structural damage seen.', anno_paint='Metallic, blend the bonnet' WHERE QTNNO='1029' AND Subquote=0;
